// What a removal leaves to the system's next start.
#include "registration/uninstall_entries.h"

#include "tests/support/product_test.h"

namespace {

using CleanupScript = ProductTest;

TEST_F(CleanupScript, IsCutWhereAWriteFailsAndThenNothingIsScheduled) {
  FailCall("WriteFile", 3);
  EXPECT_EQ(ScheduleFinalCleanup(), 0);
  EXPECT_EQ(pc.Read("drive_c/windows/Moriv.INF"),
            "[Version]\r\nSignature=$Chicago$\r\nAdvancedINF=2.0\r\n");
  EXPECT_EQ(CancelRunOnceCommand(), 0) << "no command";
  FailNothing();
  EXPECT_EQ(ScheduleFinalCleanup(), 1);
  EXPECT_EQ(pc.Read("drive_c/windows/Moriv.INF").size(), 181u);
  EXPECT_EQ(CancelRunOnceCommand(), 1);
  EXPECT_EQ(WriteRunOnceCommand(""), 0);
  EXPECT_EQ(WriteRunOnceCommand(nullptr), 0);
  EXPECT_EQ(WriteRunOnceCommand(std::string(500, 'p').c_str()), 0) << "the command doesn't fit";
  EXPECT_EQ(CancelRunOnceCommand(), 0);
}

}  // namespace

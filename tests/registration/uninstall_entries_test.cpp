// What a removal leaves to the system's next start.
#include "registration/uninstall_entries.h"

#include "tests/support/product_test.h"

namespace {

using UninstallEntries = ProductTest;

TEST_F(UninstallEntries, ACommandForTheNextStartFitsOrIsLeftOut) {
  EXPECT_EQ(WriteRunOnceCommand(""), 0);
  EXPECT_EQ(WriteRunOnceCommand(nullptr), 0);
  EXPECT_EQ(WriteRunOnceCommand(std::string(500, 'p').c_str()), 0);
  EXPECT_EQ(CancelRunOnceCommand(), 0) << "there is none";
}

}  // namespace

// The trimmed copy of the image that removes the product.
#include "registration/removal_program.h"

#include "engine/install_pass.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kProgram[] = "drive_c/windows/MorivRmv.exe";

class RemovalProgram : public ProductTest {
 protected:
  RemovalProgram() {
    ImageBuilder image;
    image.header().reserved[7] = 7;
    image.Add("zebdial.exe", "%INSTALL_DIR%", "zebdial").Write(&pc);
    EXPECT_EQ(OpenPackage(&context), 1);
    EXPECT_EQ(InstallFiles(&context), 1);
  }
};

TEST_F(RemovalProgram, TellsItsPathWhereThatFitsAndKeepsTheRestOfTheHeader) {
  char path[24] = "old";
  EXPECT_EQ(WriteRemovalProgram(&context, path, 23), 1);
  EXPECT_STREQ(path, "old");
  EXPECT_EQ(WriteRemovalProgram(&context, path, 24), 1);
  EXPECT_STREQ(path, "C:\\windows\\MorivRmv.exe");
  const std::string program = pc.Read(kProgram);
  EXPECT_EQ(program[program.size() - 260 + 7], 7) << "in the reserved bytes at the end";
}

TEST_F(RemovalProgram, FailuresLeaveNoPartOfIt) {
  EXPECT_EQ(WriteRemovalProgram(nullptr, nullptr, 0), StatusBadArgument);
  const std::pair<const char*, StatusCode> rows[] = {{"GetFileVersionInfoSizeA", StatusBadRecord},
                                                     {"WriteFile", StatusWriteRemovalFailed},
                                                     {"ReadFile", StatusWriteRemovalFailed}};
  for (const auto& [function, status] : rows) {
    FailAllCalls(function);
    EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), status) << function;
    EXPECT_FALSE(pc.Has(kProgram)) << function;
  }
  // Both ways of opening are refused: for the image, then for the copy.
  machine::SetFaults({{.function = "CreateFileA"}, {.function = "_sopen"}});
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), StatusOpenFailed);
  machine::SetFaults({{.function = "CreateFileA", .call = 2}, {.function = "_creat"}});
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), StatusCreateFileFailed);
  EXPECT_FALSE(pc.Has(kProgram));
}

}  // namespace

// Whether a package would change anything.
#include "engine/update_check.h"

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

class UpdateCheck : public ProductTest {
 protected:
  int32_t DetectInImage() {
    EXPECT_EQ(CloseSetup(&context), 1);
    EXPECT_EQ(OpenPackage(&context), 1);
    return DetectOlderFiles(&context);
  }
};

using Strings = std::vector<std::string>;

TEST_F(UpdateCheck, AMissingOrOlderFileSettlesIt) {
  ImageBuilder()
      .Add("a.exe", "%INSTALL_DIR%", std::string(3000, 'a'))
      .Add("b.exe", "%INSTALL_DIR%", "b")
      .Write(&pc);
  pc.Write("drive_c/Moriv/a.exe", VersionedProgram("9.0.0"));  // doesn't end the walk
  EXPECT_EQ(DetectInImage(), 1) << "one is missing";
  const std::pair<const char*, int32_t> rows[] = {{"4.1.7", 0}, {"5.0.0", 0}, {"4.1.6", 1},
                                                  {"4.0.9", 1}, {"3.9.9", 1}, {"", 1}};
  for (const auto& [version, result] : rows) {
    pc.Write("drive_c/Moriv/b.exe", VersionedProgram(version));
    EXPECT_EQ(DetectInImage(), result) << version;
    EXPECT_EQ(Events(), result == 1 ? Strings{"35/0"} : Strings{}) << version;
  }
}

TEST_F(UpdateCheck, FailuresHaveTheirCodeAndNoEvent) {
  EXPECT_EQ(DetectOlderFiles(nullptr), StatusBadArgument);
  EXPECT_EQ(DetectOlderFiles(&context), StatusBadArgument);
  ImageBuilder().Add("a.exe", std::string(250, 'd'), "x").Write(&pc);
  EXPECT_EQ(DetectInImage(), StatusBufferTooSmall);
  wizardState.cancelRequested = 1;
  EXPECT_EQ(DetectOlderFiles(&context), 0) << "a stop gives no verdict";
  context.header.dataOffset = 0x80000000;
  EXPECT_EQ(DetectOlderFiles(&context), StatusSeekFailed);
  EXPECT_EQ(context.packageFile, nullptr);
  EXPECT_EQ(Events(), Strings{});
}

}  // namespace

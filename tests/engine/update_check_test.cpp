// Whether a package would change anything.
#include "engine/update_check.h"

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

class UpdateCheck : public ProductTest {
 protected:
  // Two files of version 4.1.7 in C:\Moriv, and what stands there for each: "" for nothing, a
  // version, or "none" for a file without one.
  int32_t Detect(const std::string& first, const std::string& second) {
    Put("a.exe", first);
    Put("b.exe", second);
    ImageBuilder()
        .Add("a.exe", "%INSTALL_DIR%", std::string(3000, 'a'))
        .Add("b.exe", "%INSTALL_DIR%", "b")
        .Write(&pc);
    return DetectInImage();
  }

  int32_t DetectInImage() {
    EXPECT_EQ(CloseSetup(&context), 1);
    EXPECT_EQ(OpenPackage(&context), 1);
    return DetectOlderFiles(&context);
  }

  void Put(const std::string& name, const std::string& version) const {
    const std::string path = "drive_c/Moriv/" + name;
    std::filesystem::remove(pc.Host(path));
    if (!version.empty()) pc.Write(path, VersionedProgram(version == "none" ? "" : version));
  }
};

using Strings = std::vector<std::string>;

TEST_F(UpdateCheck, AMissingOrOlderFileSettlesIt) {
  const std::pair<const char*, int32_t> rows[] = {
      {"4.1.7", 0}, {"4.1.7.9", 0}, {"4.2.0", 0},      {"5.0.0", 0},
      {"4.1.8", 0}, {"4.1.6", 1},   {"4.0.9", 1},      {"3.9.9", 1},
      {"none", 1},  {"", 1},        {"4, 1, 7, 0", 1}, {"40000.1.7", 1}};
  for (const auto& [version, result] : rows) {
    EXPECT_EQ(Detect("4.1.7", version), result) << version;
    EXPECT_EQ(Events(), result == 1 ? Strings{"35/0"} : Strings{}) << version;
  }
  EXPECT_EQ(Detect("9.0.0", "4.1.6"), 1) << "a newer file doesn't end the walk";
}

TEST_F(UpdateCheck, ARecordWithoutAVersionIsNewerThanNothing) {
  Put("a.exe", "none");
  ImageBuilder builder;
  builder.Add("a.exe", "%INSTALL_DIR%", "x");
  builder.LastRecord().versionFirst = kVersionNotSet;
  builder.LastRecord().versionSecond = kVersionNotSet;
  builder.LastRecord().versionThird = kVersionNotSet;
  builder.Write(&pc);
  EXPECT_EQ(DetectInImage(), 0);
}

TEST_F(UpdateCheck, WhatCannotBeReadGivesNoVerdictAndNoEvent) {
  EXPECT_EQ(DetectOlderFiles(nullptr), StatusBadArgument);
  EXPECT_EQ(DetectOlderFiles(&context), StatusBadArgument);

  ImageBuilder damaged;
  damaged.Add("a.exe", "%PLUGIN_OPERA_DIR%", "x").Add("b.exe", "%INSTALL_DIR%", "x");
  damaged.LastRecord().recordSize = 695;
  damaged.Write(&pc);
  EXPECT_EQ(DetectInImage(), 0);

  ImageBuilder unskippable;
  unskippable.Add("a.exe", "%PLUGIN_ALL_DIR%", "x");
  unskippable.LastRecord().storedSize = 0xFFFFFFFF;
  unskippable.Write(&pc);
  EXPECT_EQ(DetectInImage(), 0);

  ImageBuilder().Write(&pc);
  EXPECT_EQ(DetectInImage(), 0) << "no records";

  ImageBuilder().Add("a.exe", std::string(250, 'd'), "x").Write(&pc);
  EXPECT_EQ(DetectInImage(), StatusBufferTooSmall);
  EXPECT_EQ(Events(), Strings{});
}

TEST_F(UpdateCheck, ASeekThatFailsClosesThePackage) {
  ImageBuilder().Add("a.exe", "%INSTALL_DIR%", "x").Write(&pc);
  ASSERT_EQ(OpenPackage(&context), 1);
  context.header.dataOffset = 0x80000000;
  EXPECT_EQ(DetectOlderFiles(&context), StatusSeekFailed);
  EXPECT_EQ(context.packageFile, nullptr);
  EXPECT_EQ(Events(), Strings{});
}

TEST_F(UpdateCheck, AStopGivesNoVerdict) {
  ImageBuilder().Add("a.exe", "%INSTALL_DIR%", "x").Write(&pc);
  ASSERT_EQ(OpenPackage(&context), 1);
  wizardState.cancelRequested = 1;
  EXPECT_EQ(DetectOlderFiles(&context), 0);
}

}  // namespace

// Paths, sizes and disk space, before any file is touched.
#include "core/run_settings.h"

#include <string>

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kCatalogDirectory[] = "C:\\Program Files\\Moriv";

TEST(FormatSize, GivesMegabytesCutToOneDecimal) {
  const std::pair<uint32_t, const char*> rows[] = {
      {0, "0"},         {104447, "0"},      {105472, "0,1"},        {241664, "0,2"},
      {1048575, "0,9"}, {1048576, "1"},     {1258291, "1,1"},       {1258496, "1,2"},
      {10590208, "10"}, {10591232, "10,1"}, {4294967295u, "4095,9"}};
  for (const auto& [bytes, expected] : rows) {
    char text[32] = "";
    EXPECT_EQ(FormatSize(bytes, text, sizeof(text)), 1);
    EXPECT_STREQ(text, expected) << bytes;
  }
  char text[8] = "before";
  EXPECT_EQ(FormatSize(4294967295u, text, 6), 0);
  EXPECT_STREQ(text, "before");
  EXPECT_EQ(FormatSize(4294967295u, text, 7), 1);
  EXPECT_EQ(FormatSize(1, nullptr, 100), 0);
}

TEST(IsValidPath, LooksBehindTheFirstColonAndCutsTrailingBlanks) {
  struct Row {
    const char* path;
    int isValid;
    const char* left;
  };
  const Row rows[] = {
      {"C:", 1, "C:"},
      {"C:\\My Files\\a b  ", 1, "C:\\My Files\\a b"},
      {"a*b", 1, "a*b"},
      {"\\\\server\\share", 1, "\\\\server\\share"},
      {"a/b ", 1, "a/b"},
      {"*:\\a", 1, "*:\\a"},
      {"C:\\\xE9", 1, "C:\\\xE9"},
      {"   ", 1, " "},
      {" a\t ", 1, " a\t"},
      {"", 0, ""},
      {"C:\\a:b", 0, "C:\\a:b"},
      {"C:/a", 0, "C:/a"},
      {"C:\\a* ", 0, "C:\\a*"},
      {"C:\\?", 0, "C:\\?"},
      {"C:\\\"a", 0, "C:\\\"a"},
      {"C:\\<", 0, "C:\\<"},
      {"C:\\>", 0, "C:\\>"},
      {"::", 0, "::"},
      {"C:\\a|b", 0, "C:\\a|b"},
  };
  for (const Row& row : rows) {
    std::string path = row.path;
    EXPECT_EQ(IsValidPath(path.data()), row.isValid) << row.path;
    EXPECT_STREQ(path.c_str(), row.left);
  }
  EXPECT_EQ(IsValidPath(nullptr), 0);
  EXPECT_EQ(CharInSet('\0', "/:*"), -1);
  EXPECT_EQ(CharInSet('a', nullptr), -1);
}

using RunSettings = ProductTest;

TEST_F(RunSettings, ADirectoryHasToFitItsBuffer) {
  constexpr size_t kNeeded = sizeof(kCatalogDirectory);
  // A default is taken untested. One that doesn't fit gives way to the catalog's.
  const std::string longest = "C:\\*" + std::string(kNeeded - 5, 'x');
  for (const std::string& standard : {longest, longest + "x"}) {
    char directory[kNeeded] = "";
    EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded, standard.c_str()), StatusOk);
    EXPECT_EQ(directory, standard == longest ? longest : kCatalogDirectory);
  }
  char directory[kNeeded] = "";
  EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded - 1, nullptr), -1);
  EXPECT_STREQ(directory, "");
  EXPECT_EQ(ChooseInstallDir(&context, nullptr, kNeeded, "C:\\a"), StatusBadArgument);
  EXPECT_EQ(ChooseInstallDir(&context, directory, 0, "C:\\a"), StatusBadArgument);
  EXPECT_EQ(GetDefaultInstallDir(&context, nullptr, kNeeded), -1);
  // A language without rows has no default.
  context.currentLanguage = 50000;
  EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded, nullptr), StatusBadDirectory);
}

TEST_F(RunSettings, FreeSpaceIsComparedIn64BitsAndStopsNothingWhenUnknown) {
  context.header.spaceNeeded = 4294967295u;
  for (const bool hasNewerQuestion : {true, false}) {
    machine::CurrentSettings().hasGetDiskFreeSpaceEx = hasNewerQuestion;
    machine::CurrentSettings().disks['C'].freeBytes = uint64_t{5} << 30;
    EXPECT_EQ(CheckDiskSpace(&context), StatusOk);
    machine::CurrentSettings().disks['C'].freeBytes = 4294967294u;
    EXPECT_EQ(CheckDiskSpace(&context), StatusNoDiskSpace);
  }
  EXPECT_EQ(CheckDiskSpace(nullptr), StatusBadArgument);
  uint64_t bytes = 0;
  EXPECT_FALSE(GetFreeDiskSpace("Q:\\a", &bytes));
  EXPECT_FALSE(GetFreeDiskSpace(nullptr, &bytes));
  EXPECT_FALSE(GetFreeDiskSpace((std::string(260, 'a') + "\\b").c_str(), &bytes));
  machine::CurrentSettings().hasGetDiskFreeSpaceEx = true;
  FailCall("GetDiskFreeSpaceExA");  // then the older question has the answer
  EXPECT_EQ(CheckDiskSpace(&context), StatusNoDiskSpace);
  FailAllCalls("LoadLibraryA");
  EXPECT_EQ(CheckDiskSpace(&context), StatusOk);
}

TEST_F(RunSettings, AskingForTheSpaceNeededLeavesAnOpenPackageOpen) {
  ImageBuilder().Write(&pc);
  ASSERT_EQ(OpenPackage(&context), StatusOk);
  EXPECT_EQ(GetNeededSpace(&context), 0u);
  EXPECT_NE(context.packageFile, nullptr);
}

}  // namespace

// Paths, sizes and disk space, before any file is touched.
#include "core/run_settings.h"

#include <cstring>
#include <string>

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kCatalogDirectory[] = "C:\\Program Files\\Moriv";

TEST(FormatSize, GivesMegabytesCutToOneDecimal) {
  struct Row {
    uint32_t bytes;
    const char* text;
  };
  const Row rows[] = {
      {0, "0"},         {1, "0"},           {104447, "0"},           {104448, "0"},
      {105472, "0,1"},  {241664, "0,2"},    {1048575, "0,9"},        {1048576, "1"},
      {1258291, "1,1"}, {1258496, "1,2"},   {1572864, "1,5"},        {10485760, "10"},
      {10590208, "10"}, {10591232, "10,1"}, {4294967295u, "4095,9"},
  };
  for (const Row& row : rows) {
    char text[32] = "";
    EXPECT_EQ(FormatSize(row.bytes, text, sizeof(text)), 1);
    EXPECT_STREQ(text, row.text) << row.bytes;
  }
  char text[8] = "before";
  EXPECT_EQ(FormatSize(4294967295u, text, 6), 0);
  EXPECT_STREQ(text, "before");
  EXPECT_EQ(FormatSize(4294967295u, text, 7), 1);
  EXPECT_EQ(FormatSize(1, nullptr, 100), 0);
}

TEST(IsValidPath, LooksBehindTheFirstColonAlone) {
  for (const char* good : {"C:", "C:\\a", "C:\\My Files\\a b", "a", "a*b", "\\\\server\\share",
                           "a/b", "<a>", " ", "*:\\a", "C:\\a\xE9"}) {
    std::string path = good;
    EXPECT_EQ(IsValidPath(path.data()), 1) << good;
  }
  for (const char* bad :
       {"", "C:\\a:b", "C:/a", "C:\\a*", "C:\\?", "C:\\\"a\"", "C:\\<", "C:\\>", "C:\\a|b", "::"}) {
    std::string path = bad;
    EXPECT_EQ(IsValidPath(path.data()), 0) << bad;
  }
  EXPECT_EQ(IsValidPath(nullptr), 0);
}

TEST(IsValidPath, CutsTrailingBlanksButNeverTheFirstCharacter) {
  const char* const rows[][2] = {
      {"C:\\a  ", "C:\\a"}, {"   ", " "}, {" a ", " a"}, {"a\t ", "a\t"}, {"C:\\* ", "C:\\*"}};
  for (const auto& [given, left] : rows) {
    std::string path = given;
    (void)IsValidPath(path.data());
    EXPECT_STREQ(path.c_str(), left);
  }
}

TEST(CharInSet, NeedsACharacterAndASet) {
  EXPECT_EQ(CharInSet('*', "/:*"), 1);
  EXPECT_EQ(CharInSet('a', "/:*"), 0);
  EXPECT_EQ(CharInSet('\0', "/:*"), -1);
  EXPECT_EQ(CharInSet('a', nullptr), -1);
  EXPECT_EQ(CharInSet('a', ""), -1);
}

using RunSettings = ProductTest;

TEST_F(RunSettings, ChooseTheGivenDirectoryElseTheDefaultElseTheCatalogs) {
  struct Row {
    const char* given;
    const char* standard;
    const char* chosen;
  };
  const Row rows[] = {
      {"D:\\x  ", "C:\\y", "D:\\x"},
      {"", "C:\\y", "C:\\y"},
      {"C:\\a*", "C:\\y", "C:\\y"},
      {"C:\\a*", "C:\\still*", "C:\\still*"},  // the default isn't tested
      {"", "", kCatalogDirectory},
      {"C:\\a*", nullptr, kCatalogDirectory},
  };
  for (const Row& row : rows) {
    (void)CopyText(context.installDir, row.given);
    EXPECT_EQ(ChooseInstallDir(&context, context.installDir, kPathSize, row.standard), StatusOk);
    EXPECT_STREQ(context.installDir, row.chosen) << row.given;
  }
}

TEST_F(RunSettings, ADirectoryHasToFitItsBuffer) {
  constexpr size_t kNeeded = sizeof(kCatalogDirectory);
  char directory[kNeeded] = "";
  // A default that doesn't fit gives way to the catalog's.
  const std::string longest = "C:\\" + std::string(kNeeded - 4, 'x');
  EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded, (longest + "x").c_str()), StatusOk);
  EXPECT_STREQ(directory, kCatalogDirectory);
  directory[0] = '\0';
  EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded, longest.c_str()), StatusOk);
  EXPECT_EQ(directory, longest);

  directory[0] = '\0';
  EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded - 1, nullptr), -1);
  EXPECT_STREQ(directory, "");
  EXPECT_EQ(ChooseInstallDir(&context, nullptr, kNeeded, "C:\\a"), StatusBadArgument);
  EXPECT_EQ(ChooseInstallDir(&context, directory, 0, "C:\\a"), StatusBadArgument);
  EXPECT_EQ(GetDefaultInstallDir(&context, nullptr, kNeeded), -1);

  // A language without rows has no default.
  context.currentLanguage = 50000;
  EXPECT_EQ(ChooseInstallDir(&context, directory, kNeeded, nullptr), StatusBadDirectory);
}

TEST_F(RunSettings, TheSpaceNeededMayEqualTheFreeSpace) {
  struct Row {
    uint64_t freeBytes;
    bool hasNewerQuestion;
    uint32_t needed;
    StatusCode status;
  };
  constexpr uint32_t kMost = 4294967295u;
  const Row rows[] = {
      {10000, true, 10000, StatusOk},
      {10000, true, 10001, StatusNoDiskSpace},
      {10000, false, 8192, StatusOk},  // whole clusters of 4096
      {10000, false, 8193, StatusNoDiskSpace},
      {0, true, 0, StatusOk},
      {uint64_t{5} << 30, true, kMost, StatusOk},
      {uint64_t{5} << 30, false, kMost, StatusOk},
      {kMost - 1, true, kMost, StatusNoDiskSpace},
  };
  for (const Row& row : rows) {
    machine::CurrentSettings().disks['C'].freeBytes = row.freeBytes;
    machine::CurrentSettings().hasGetDiskFreeSpaceEx = row.hasNewerQuestion;
    context.header.spaceNeeded = row.needed;
    EXPECT_EQ(CheckDiskSpace(&context), row.status)
        << row.needed << " of " << row.freeBytes << (row.hasNewerQuestion ? "" : ", older");
  }
  EXPECT_EQ(CheckDiskSpace(nullptr), StatusBadArgument);
}

TEST_F(RunSettings, UnknownFreeSpaceStopsNothing) {
  context.header.spaceNeeded = 4294967295u;
  machine::CurrentSettings().disks['C'].freeBytes = 1;
  uint64_t bytes = 0;
  for (const char* path : {"", "C:", "relative", "Q:\\a"}) {
    (void)CopyText(context.installDir, path);
    EXPECT_FALSE(GetFreeDiskSpace(context.installDir, &bytes)) << path;
    EXPECT_EQ(CheckDiskSpace(&context), StatusOk) << path;
  }
  EXPECT_FALSE(GetFreeDiskSpace(nullptr, &bytes));
  EXPECT_FALSE(GetFreeDiskSpace((std::string(260, 'a') + "\\b").c_str(), &bytes));

  (void)CopyText(context.installDir, "C:\\a");
  FailCall("GetDiskFreeSpaceExA");  // then the older question has the answer
  EXPECT_EQ(CheckDiskSpace(&context), StatusNoDiskSpace);
  FailAllCalls("LoadLibraryA");
  EXPECT_EQ(CheckDiskSpace(&context), StatusOk);
  machine::CurrentSettings().hasGetDiskFreeSpaceEx = false;
  FailAllCalls("GetDiskFreeSpaceA");
  EXPECT_EQ(CheckDiskSpace(&context), StatusOk);
}

TEST_F(RunSettings, AskingForTheSpaceNeededLeavesThePackageAsItWas) {
  ImageBuilder image;
  image.header().spaceNeeded = 241664;
  image.Write(&pc);
  EXPECT_EQ(GetNeededSpace(&context), 241664u);
  EXPECT_EQ(context.packageFile, nullptr);
  ASSERT_EQ(OpenPackage(&context), StatusOk);
  EXPECT_EQ(GetNeededSpace(&context), 241664u);
  EXPECT_NE(context.packageFile, nullptr);
  EXPECT_EQ(GetNeededSpace(nullptr), 0u);

  (void)CloseSetup(&context);
  pc.Restart("");
  EXPECT_EQ(GetNeededSpace(&context), 0u);
}

}  // namespace

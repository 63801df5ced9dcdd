// The small operations on paths, and the bounded work on texts under them.
#include "package/paths.h"
#include "platform/text.h"

#include "tests/support/product_test.h"

namespace {

using Paths = ProductTest;

TEST_F(Paths, AFileIsNoDirectoryAndADirectoryNoFile) {
  pc.Write("drive_c/a/b.txt", "");
  struct Row {
    const char* path;
    int file;
    int directory;
  };
  const Row rows[] = {{"C:\\a\\b.txt", 1, 0}, {"C:\\a", 0, 1},         {"C:\\a\\", 0, 1},
                      {"C:", 0, 1},           {"C:\\a\\*", 0, 0},      {"", 0, 0},
                      {nullptr, 0, 0},        {"C:\\a\\b.txt\\", 0, 0}};
  for (const Row& row : rows) {
    const char* const name = row.path != nullptr ? row.path : "null";
    EXPECT_EQ(FileExists(row.path), row.file) << name;
    EXPECT_EQ(DirectoryExists(row.path), row.directory) << name;
  }
  EXPECT_EQ(DeleteFileChecked("C:\\a"), 0);
  EXPECT_EQ(RemoveDirectoryChecked("C:\\a\\b.txt"), 0);
  for (const char* none : {static_cast<const char*>(nullptr), ""}) {
    EXPECT_EQ(DeleteFileChecked(none), StatusBadArgument);
    EXPECT_EQ(RemoveDirectoryChecked(none), StatusBadArgument);
  }
}

TEST_F(Paths, TheWindowsDirectoryFitsOrLeavesTheBufferAlone) {
  constexpr size_t kNeeded = sizeof("C:\\windows");
  char buffer[kNeeded] = "old";
  EXPECT_EQ(GetWindowsDir(buffer, kNeeded - 1), 0);
  EXPECT_EQ(GetWindowsDir(buffer, 0), 0);
  EXPECT_STREQ(buffer, "old");
  EXPECT_EQ(GetWindowsDir(nullptr, kNeeded), 0);
  EXPECT_EQ(GetWindowsDir(buffer, kNeeded), 1);
  EXPECT_STREQ(buffer, "C:\\windows");
  // The system is asked once in the life of a process.
  FailAllCalls("GetWindowsDirectoryA");
  EXPECT_EQ(GetWindowsDir(buffer, kNeeded), 1);
}

TEST(Texts, OneBackslashIsAppendedWhereThereIsNone) {
  const char* const rows[][2] = {{"", ""}, {"C:", "C:\\"}, {"C:\\", "C:\\"}, {"C:\\a", "C:\\a"}};
  for (const auto& [before, after] : rows) {
    char text[5] = "";  // "C:\\a" leaves no room
    ASSERT_TRUE(CopyText(text, before));
    EXPECT_EQ(AppendBackslash(text), strlen(after) - strlen(before));
    EXPECT_STREQ(text, after);
  }
  EXPECT_EQ(AppendBackslash(nullptr, 5), 0);
}

TEST(Texts, WhatDoesNotFitWholeIsLeftOut) {
  char text[5] = "old";
  EXPECT_FALSE(CopyText(text, "12345"));
  EXPECT_FALSE(CopyText(text, 0, ""));
  EXPECT_FALSE(AppendText(text, "45"));
  EXPECT_STREQ(text, "old");
  EXPECT_TRUE(AppendText(text, "4"));
  EXPECT_STREQ(text, "old4");
  EXPECT_TRUE(FormatText(text, sizeof(text), "%s%d", "abc", 4));
  EXPECT_STREQ(text, "abc4");
  EXPECT_FALSE(FormatText(text, sizeof(text), "%s%d", "abc", 45));
  EXPECT_STREQ(text, "");
  EXPECT_FALSE(FormatText(text, 0, "%s", ""));
}

TEST(Texts, CaseIsThatOfAsciiLettersAlone) {
  EXPECT_TRUE(EqualIgnoringCase("aZ9", "Az9"));
  EXPECT_FALSE(EqualIgnoringCase("a", "ab"));
  EXPECT_FALSE(EqualIgnoringCase("ab", "a"));
  EXPECT_FALSE(EqualIgnoringCase("\xE9", "\xC9"));
  EXPECT_FALSE(EqualIgnoringCase("[", "{")) << "neighbours of the letters";
  EXPECT_FALSE(BeginsWithIgnoringCase("d", "d:"));
}

}  // namespace

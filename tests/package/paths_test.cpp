// The small operations on paths, and the bounded work on texts under them.
#include "package/paths.h"
#include "platform/text.h"

#include "tests/support/product_test.h"

namespace {

using Paths = ProductTest;

TEST_F(Paths, AFileIsNoDirectoryAndADirectoryNoFile) {
  pc.Write("drive_c/a/b.txt", "");
  EXPECT_EQ(FileExists("C:\\a\\b.txt"), 1);
  EXPECT_EQ(DirectoryExists("C:\\a\\b.txt"), 0);
  for (const char* directory : {"C:\\a", "C:\\a\\", "C:"}) {
    EXPECT_EQ(FileExists(directory), 0) << directory;
    EXPECT_EQ(DirectoryExists(directory), 1) << directory;
  }
  for (const char* none : {"C:\\a\\*", "C:\\a\\b.txt\\", "", static_cast<const char*>(nullptr)}) {
    EXPECT_EQ(FileExists(none) + DirectoryExists(none), 0);
    const StatusCode refused = IsMissingOrEmpty(none) ? StatusBadArgument : 0;
    EXPECT_EQ(DeleteFileChecked(none), refused);
    EXPECT_EQ(RemoveDirectoryChecked(none), refused);
  }
  EXPECT_EQ(DeleteFileChecked("C:\\a") + RemoveDirectoryChecked("C:\\a\\b.txt"), 0);
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

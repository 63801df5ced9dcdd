// Versions of files, and their comparison.
#include "engine/file_version.h"

#include <array>

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

using Version = std::array<int, 3>;

Version Parse(const char* text) {
  int16_t fields[3] = {};
  EXPECT_EQ(ParseVersionText(text, fields), *text != '\0' ? StatusOk : StatusNoVersion);
  return {fields[0], fields[1], fields[2]};
}

TEST(VersionText, EverySeparatorClosesANumber) {
  const std::pair<const char*, Version> rows[] = {
      {"4.1.7.0.3", {4, 1, 0}},
      {"4,1,7,2", {4, 1, 7}},
      {"3, 44, 6, 2", {3, 0, 0}},
      {"4.1", {4, 0, 1}},
      {"4", {0, 0, 4}},
      {"", {-1, -1, -1}},
      {"v4-1-7b", {0, 1, 7}},
      {"\t4.+1.-7", {4, 1, 0}},
      {"65535.2.3", {2, 0, 3}},  // the first number stays open
      {"40000.1.7", {-25536, 1, 7}},
      {"123456789012345678.1.2", {static_cast<int16_t>(123456789012345 & 0xFFFF), 1, 2}}};
  for (const auto& [text, version] : rows) EXPECT_EQ(Parse(text), version) << text;
  int16_t fields[3];
  EXPECT_EQ(ParseVersionText(nullptr, fields), StatusBadArgument);
  EXPECT_EQ(ParseVersionText("1", nullptr), StatusBadArgument);
}

FileRecord Record(const char* name, Version version) {
  FileRecord record = {};
  (void)CopyText(record.fileName, name);
  record.versionFirst = static_cast<int16_t>(version[0]);
  record.versionSecond = static_cast<int16_t>(version[1]);
  record.versionThird = static_cast<int16_t>(version[2]);
  return record;
}

TEST(RecordComparisons, TheFirstDifferenceDecides) {
  const FileRecord a = Record("a", {4, 1, 7});
  const std::pair<Version, RecordComparison> rows[] = {
      {{4, 1, 7}, ComparisonEqual},         {{3, 9, 9}, ComparisonFirstGreater},
      {{4, 0, 9}, ComparisonSecondGreater}, {{4, 1, 6}, ComparisonThirdGreater},
      {{5, 0, 0}, ComparisonFirstSmaller},  {{4, 2, 0}, ComparisonSecondSmaller},
      {{4, 1, 8}, ComparisonThirdSmaller},  {{-1, -1, -1}, ComparisonFirstGreater}};
  for (const auto& [version, comparison] : rows) {
    const FileRecord b = Record("a", version);
    EXPECT_EQ(CompareFileRecords(&a, &b), comparison) << version[0] << version[1] << version[2];
  }
  const FileRecord upper = Record("A", {4, 1, 7});
  const FileRecord nameless = Record("", {4, 1, 7});
  EXPECT_EQ(CompareFileRecords(&a, &upper), ComparisonOtherName);
  EXPECT_EQ(CompareFileRecords(&a, &nameless), ComparisonNoName);
  EXPECT_EQ(CompareFileRecords(&nameless, &a), ComparisonNoName);
  EXPECT_EQ(CompareFileRecords(nullptr, &a), ComparisonNoName);
}

using FileVersion = ProductTest;

TEST_F(FileVersion, IsCompleteWithATranslationWhichNamesTheBlock) {
  FileRecord record = {};
  const std::string version = VersionResource({{"FileVersion", "1.2.3"}}, 0x0407, 0x04E4);
  const std::string program = PortableExecutable(true, 16, 1, {{0x407, version}});
  pc.Write("drive_c/a.exe", program);
  EXPECT_EQ(ReadFileRecordFromDisk("C:\\a.exe", &record), 1);
  EXPECT_STREQ(record.versionLanguage, "040704e4");
  EXPECT_EQ(record.versionThird, 3);
  EXPECT_EQ(record.recordSize, 696);
  EXPECT_EQ(record.fileSize, program.size());
  // Without one it is read from the usual block.
  const std::string bare = VersionResource({{"FileVersion", "4.1.7"}}, 0x040C, 0x04B0, false);
  pc.Write("drive_c/a.exe", PortableExecutable(false, 16, 1, {{0x40C, bare}}));
  EXPECT_EQ(ReadFileRecordFromDisk("C:\\a.exe", &record), 0);
  EXPECT_STREQ(record.versionLanguage, "");
  EXPECT_EQ(record.versionFirst, 4);
}

TEST_F(FileVersion, OfOtherFilesIsNotSet) {
  pc.Write("drive_c/a.txt", "text");
  FileRecord record = {};
  for (const char* path : {"C:\\a.txt", "C:\\absent.exe", "C:\\windows"}) {
    EXPECT_EQ(ReadFileRecordFromDisk(path, &record), 0) << path;
    EXPECT_EQ(record.versionFirst, kVersionNotSet) << path;
  }
  EXPECT_EQ(ReadFileRecordFromDisk("", &record), StatusBadArgument);
  EXPECT_EQ(ReadFileRecordFromDisk("C:\\a.txt", nullptr), StatusBadArgument);
  pc.Write("drive_c/a.exe", VersionedProgram("4.1.7"));
  for (const char* function : {"GlobalAlloc", "GlobalLock", "GetFileVersionInfoA", "VerQueryValueA",
                               "LoadLibraryA", "GetSystemDirectoryA"}) {
    FailAllCalls(function);
    EXPECT_EQ(ReadFileRecordFromDisk("C:\\a.exe", &record), 0) << function;
    EXPECT_EQ(record.versionFirst, kVersionNotSet) << function;
  }
}

}  // namespace

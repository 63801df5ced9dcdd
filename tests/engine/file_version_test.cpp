// Versions of files, and their comparison.
#include "engine/file_version.h"

#include <array>
#include <utility>

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

using Version = std::array<int16_t, 3>;

TEST(VersionText, EverySeparatorClosesANumber) {
  const std::pair<std::string, Version> rows[] = {
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
      {"123456789012345678.1.2", {static_cast<int16_t>(123456789012345 & 0xFFFF), 1, 2}},
      {"1.2." + std::string(252, 'x') + ".3.9.", {1, 2, 3}}};  // 259 characters count
  for (const auto& [text, version] : rows) {
    Version fields = {};
    EXPECT_EQ(ParseVersionText(text.c_str(), fields.data()),
              text.empty() ? StatusNoVersion : StatusOk);
    EXPECT_EQ(fields, version) << text;
  }
  Version fields = {};
  int16_t four[] = {0, 0, 0, 77};
  EXPECT_EQ(ParseVersionText("1.2.3.4", four), StatusOk);
  EXPECT_EQ(four[3], 77) << "there are three fields";
  EXPECT_EQ(ParseVersionText(nullptr, fields.data()), StatusBadArgument);
  EXPECT_EQ(ParseVersionText("1", nullptr), StatusBadArgument);
}

FileRecord Record(const char* name, const Version& version) {
  FileRecord record = {};
  (void)CopyText(record.fileName, name);
  record.versionFirst = version[0];
  record.versionSecond = version[1];
  record.versionThird = version[2];
  return record;
}

TEST(RecordComparisons, TheFirstDifferenceDecides) {
  const struct {
    const char* name;
    Version version;
    RecordComparison comparison;
  } rows[] = {
      {"a", {4, 1, 7}, ComparisonEqual},         {"a", {3, 9, 9}, ComparisonFirstGreater},
      {"a", {4, 0, 9}, ComparisonSecondGreater}, {"a", {4, 1, 6}, ComparisonThirdGreater},
      {"a", {5, 0, 0}, ComparisonFirstSmaller},  {"a", {4, 2, 0}, ComparisonSecondSmaller},
      {"a", {4, 1, 8}, ComparisonThirdSmaller},  {"a", {-1, -1, -1}, ComparisonFirstGreater},
      {"A", {4, 1, 7}, ComparisonOtherName},     {"", {4, 1, 7}, ComparisonNoName}};
  const FileRecord a = Record("a", {4, 1, 7});
  for (const auto& [name, version, comparison] : rows) {
    const FileRecord b = Record(name, version);
    EXPECT_EQ(CompareFileRecords(&a, &b), comparison) << name << version[0] << version[1];
  }
  const FileRecord nameless = {};
  for (const FileRecord* none : {&nameless, static_cast<const FileRecord*>(nullptr)}) {
    EXPECT_EQ(CompareFileRecords(none, &a), ComparisonNoName);
    EXPECT_EQ(CompareFileRecords(&a, none), ComparisonNoName);
  }
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

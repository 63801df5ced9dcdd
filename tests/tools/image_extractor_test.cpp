// Extraction: the packed files come back, and nothing is ever written elsewhere or left half-done.

#include "tools/image/image_extractor.h"

#include <cstring>
#include <string>

#include "tests/tools/tool_bench.h"

namespace {

using ImageExtractor = ToolBench;
using Names = std::vector<std::string>;

}  // namespace

TEST_F(ImageExtractor, GivesBackWhatWasPacked) {
  PackSample();
  const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@out"});
  ASSERT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(NamesIn("out"), (Names{"a.exe", "b.dll", "readme.txt"}));
  EXPECT_TRUE(Read("out/a.exe") == Read("a.exe"));
  EXPECT_TRUE(Read("out/b.dll") == Read("b.dll"));
  EXPECT_TRUE(Read("out/readme.txt").empty());
}

TEST_F(ImageExtractor, TakesNamesWithoutRegardToCase) {
  PackSample();
  ASSERT_EQ(RunImage({"extract", "@image.exe", "-o", "@out", "B.DLL"}).status, 0);
  EXPECT_EQ(NamesIn("out"), Names{"b.dll"});
  const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@new", "b.dll", "c.dll"});
  EXPECT_EQ(run.status, 2);
  EXPECT_NE(run.err.find("no file \"c.dll\""), std::string::npos) << run.err;
  EXPECT_FALSE(std::filesystem::exists(Path("new")));
}

TEST_F(ImageExtractor, ReplacesOnlyWhenForced) {
  PackSample();
  std::filesystem::create_directory(Path("out"));
  Write("out/b.dll", "mine");
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@out"}).status, 2);
  EXPECT_EQ(NamesIn("out"), Names{"b.dll"});
  EXPECT_EQ(ReadText("out/b.dll"), "mine");
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@out", "--force"}).status, 0);
  EXPECT_TRUE(Read("out/b.dll") == Read("b.dll"));
}

TEST_F(ImageExtractor, NeverFollowsALinkOutOfTheFolder) {
  PackSample();
  std::filesystem::create_directory(Path("out"));
  Write("outside", "mine");
  std::filesystem::create_symlink(Path("outside"), Path("out/b.dll"));
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@out"}).status, 2);
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@out", "--force"}).status, 0);
  EXPECT_EQ(ReadText("outside"), "mine");
}

TEST_F(ImageExtractor, StaysInsideItsFolder) {
  PackSample();
  const std::vector<uint8_t> good = Read("image.exe");
  const Names before = NamesIn(".");
  for (const char* name : {"../b.dll", "..\\b.dll", "..", ".", "", "/etc/b.dll", "a/b", "C:b",
                           "nul", "a\nb", "0123456789012345678901234567890123"}) {
    Write("image.exe", good);
    ChangeRecord(1, [name](FileRecord* record) {
      std::memset(record->fileName, 0, sizeof record->fileName);
      std::memcpy(record->fileName, name, std::min(std::strlen(name), sizeof record->fileName));
    });
    const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@out", "--force"});
    EXPECT_EQ(run.status, 2) << name;
    EXPECT_EQ(run.err.find('\n'), run.err.size() - 1) << run.err;
    EXPECT_EQ(NamesIn("."), before) << name;
  }
}

TEST_F(ImageExtractor, LeavesNothingOfADamagedImage) {
  PackSample();
  std::vector<uint8_t> image = Read("image.exe");
  image[RecordOffset("image.exe", 1) + 699] ^=
      0x80;  // the top bit of the second stream's first code
  Write("image.exe", image);
  const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@out"});
  EXPECT_EQ(run.status, 2);
  EXPECT_NE(run.err.find("\"b.dll\""), std::string::npos) << run.err;
  EXPECT_FALSE(std::filesystem::exists(Path("out")));
}

TEST_F(ImageExtractor, NeverWritesMoreThanTheRecordTells) {
  PackSample();
  Write("zeros.bin", std::vector<uint8_t>(5'000'000));
  Write("setup.toml", "[[file]]\nsource = 'zeros.bin'\ndestination = 'x'\n");
  ASSERT_EQ(RunImage({"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@image.exe"}).status, 0);
  ChangeRecord(0, [](FileRecord* record) { record->fileSize = 100; });
  const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@out"});
  EXPECT_EQ(run.status, 2);
  EXPECT_NE(run.err.find("more than the fileSize 100"), std::string::npos) << run.err;
}

TEST_F(ImageExtractor, TakesOneFileTwiceButNotTwoOfOneName) {
  PackSample();
  const std::string twice =
      "[[file]]\nsource = 'a.exe'\ndestination = 'x'\n"
      "[[file]]\nname = 'A.exe'\ndestination = 'y'\nsource = ";
  Write("setup.toml", twice + "'a.exe'\n");
  ASSERT_EQ(RunImage({"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@image.exe"}).status, 0);
  ASSERT_EQ(RunImage({"extract", "@image.exe", "-o", "@out"}).status, 0);
  EXPECT_EQ(NamesIn("out"), Names{"a.exe"});
  Write("setup.toml", twice + "'b.dll'\n");
  ASSERT_EQ(RunImage({"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@image.exe"}).status, 0);
  const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@other"});
  EXPECT_EQ(run.status, 2);
  EXPECT_NE(run.err.find("two different files"), std::string::npos) << run.err;
  EXPECT_FALSE(std::filesystem::exists(Path("other")));
}

TEST_F(ImageExtractor, RefusesARemovalProgramAndBadUsage) {
  PackSample();
  ASSERT_EQ(RunImage({"removal", "@image.exe", "-o", "@removal.exe"}).status, 0);
  EXPECT_EQ(RunImage({"extract", "@removal.exe", "-o", "@out"}).status, 2);
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@missing/out"}).status, 2);
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@a.exe"}).status, 2);
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{},
        {"unpack"},
        {"list"},
        {"list", "@image.exe", "--all"},
        {"removal", "@image.exe", "-o", "@x", "--language", "latin"}}) {
    const ToolRun run = RunImage(arguments);
    EXPECT_EQ(run.status, 2);
    EXPECT_EQ(run.err.find('\n'), run.err.size() - 1) << run.err;
  }
  EXPECT_EQ(RunImage({"--help"}).status, 0);
  EXPECT_EQ(RunImage({"extract", "--help"}).status, 0);
}

// Extraction: the packed files come back, and nothing is ever written elsewhere or left half-done.

#include "tools/image/image_extractor.h"

#include <cstring>
#include <string>

#include "tests/tools/tool_bench.h"

namespace {

using Names = std::vector<std::string>;

using ImageExtractor = ToolBench;

}  // namespace

TEST_F(ImageExtractor, GivesBackWhatWasPackedAllOrByName) {
  PackSample();
  const ToolRun run = RunImage({"extract", "@image.exe", "-o", "@out"});
  ASSERT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(NamesIn("out"), (Names{"a.exe", "b.dll", "readme.txt"}));
  EXPECT_TRUE(Read("out/a.exe") == Read("a.exe"));
  EXPECT_TRUE(Read("out/b.dll") == Read("b.dll"));
  EXPECT_TRUE(Read("out/readme.txt").empty());

  ASSERT_EQ(RunImage({"extract", "@image.exe", "-o", "@one", "B.DLL"}).status, 0);
  EXPECT_EQ(NamesIn("one"), Names{"b.dll"});
  ExpectRefused(RunImage({"extract", "@image.exe", "-o", "@new", "b.dll", "c.dll"}),
                "no file \"c.dll\"");
}

TEST_F(ImageExtractor, ReplacesOnlyWhenForcedAndNeverBehindALink) {
  PackSample();
  std::filesystem::create_directory(Host("out"));
  Write("mine", "mine");
  std::filesystem::create_symlink(Host("mine"), Host("out/b.dll"));
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@out"}).status, 2);
  EXPECT_EQ(NamesIn("out"), Names{"b.dll"});
  EXPECT_EQ(Read("out/b.dll"), "mine");
  EXPECT_EQ(RunImage({"extract", "@image.exe", "-o", "@out", "--force"}).status, 0);
  EXPECT_TRUE(Read("out/b.dll") == Read("b.dll"));
  EXPECT_EQ(Read("mine"), "mine");
}

TEST_F(ImageExtractor, StaysInsideItsFolder) {
  PackSample();
  for (const char* name : {"../b.dll", "..\\b.dll", "..", ".", "", "/etc/b.dll", "a/b", "C:b",
                           "nul", "a\nb", "0123456789012345678901234567890123"}) {
    ChangeRecord(1, [name](FileRecord* record) {
      std::memset(record->fileName, 0, sizeof record->fileName);
      std::string_view(name).copy(record->fileName, sizeof record->fileName);
    });
    ExpectRefused(RunImage({"extract", "@image.exe", "-o", "@new", "--force"}));
  }
}

TEST_F(ImageExtractor, RefusesAStreamThatIsLongerThanItsRecordSays) {
  PackSample();
  ChangeRecord(0, [](FileRecord* record) { record->fileSize = 100; });
  ExpectRefused(RunImage({"extract", "@image.exe", "-o", "@new"}), "more than the fileSize 100");
}

TEST_F(ImageExtractor, TakesOneFileTwiceButNotTwoOfOneName) {
  PackSample();
  const std::string twice =
      "[[file]]\nsource = 'a.exe'\ndestination = 'x'\n"
      "[[file]]\nname = 'A.exe'\ndestination = 'y'\nsource = ";
  const Names pack = {"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@image.exe"};
  Write("setup.toml", twice + "'a.exe'\n");
  ASSERT_EQ(RunImage(pack).status, 0);
  ASSERT_EQ(RunImage({"extract", "@image.exe", "-o", "@out"}).status, 0);
  EXPECT_EQ(NamesIn("out"), Names{"a.exe"});
  Write("setup.toml", twice + "'b.dll'\n");
  ASSERT_EQ(RunImage(pack).status, 0);
  ExpectRefused(RunImage({"extract", "@image.exe", "-o", "@new"}), "two different files");
}

TEST_F(ImageExtractor, RefusesARemovalProgramAndBadUsage) {
  PackSample();
  ASSERT_EQ(RunImage({"removal", "@image.exe", "-o", "@removal.exe"}).status, 0);
  for (const Names& arguments : {Names{"extract", "@removal.exe", "-o", "@new"},
                                 {"extract", "@image.exe", "-o", "@missing/out"},
                                 {"extract", "@image.exe", "-o", "@a.exe"},
                                 {},
                                 {"unpack"},
                                 {"list"},
                                 {"list", "@image.exe", "--all"},
                                 {"removal", "@image.exe", "-o", "@new", "--language", "latin"}}) {
    ExpectRefused(RunImage(arguments));
  }
  EXPECT_EQ(RunImage({"extract", "--help"}).status, 0);
}

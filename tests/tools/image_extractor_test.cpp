// Extraction: the packed files come back, and nothing is ever written elsewhere or left half-done.

#include "tools/image/image_extractor.h"

#include <string>

#include "tests/tools/tool_bench.h"

namespace {

using Names = std::vector<std::string>;
using ImageExtractor = SampleBench;

}  // namespace

TEST_F(ImageExtractor, GivesBackWhatWasPackedAllOrByName) {
  const ToolRun run = Run("extract @image.exe -o @out");
  ASSERT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(NamesIn("out"), (Names{"a.exe", "b.dll", "readme.txt"}));
  EXPECT_TRUE(Read("out/a.exe") == Read("a.exe"));
  EXPECT_TRUE(Read("out/b.dll") == Read("b.dll"));
  EXPECT_TRUE(Read("out/readme.txt").empty());

  ASSERT_EQ(Run("extract @image.exe -o @one B.DLL").status, 0);
  EXPECT_EQ(NamesIn("one"), Names{"b.dll"});
  ExpectRefused(Run("extract @image.exe -o @new b.dll c.dll"), "no file \"c.dll\"");
}

TEST_F(ImageExtractor, ReplacesOnlyWhenForcedAndNeverBehindALink) {
  Write("mine", "mine");
  std::filesystem::create_directory(Host("out"));
  std::filesystem::create_symlink(Host("mine"), Host("out/b.dll"));
  ExpectRefused(Run("extract @image.exe -o @out"));
  EXPECT_EQ(NamesIn("out"), Names{"b.dll"});
  EXPECT_EQ(Read("out/b.dll"), "mine");
  EXPECT_EQ(Run("extract @image.exe -o @out --force").status, 0);
  EXPECT_TRUE(Read("out/b.dll") == Read("b.dll"));
  EXPECT_EQ(Read("mine"), "mine");
}

TEST_F(ImageExtractor, StaysInsideItsFolderAndItsSizes) {
  FileRecord& record = sample.pieces()[1].record;
  for (const char* name : {"../b.dll", "..\\b.dll", "..", ".", "", "/etc/b.dll", "a/b", "C:b",
                           "nul", "a\nb", "0123456789012345678901234567890123"}) {
    SetField(record.fileName, name);
    Write("image.exe", sample.RawBytes());
    ExpectRefused(Run("extract @image.exe -o @new --force"));
  }
  SetField(record.fileName, "b.dll");
  record.fileSize = 100;
  Write("image.exe", sample.RawBytes());
  ExpectRefused(Run("extract @image.exe -o @new"), "more than the fileSize 100");
}

TEST_F(ImageExtractor, TakesOneFileTwiceButNotTwoOfOneName) {
  const std::string twice =
      "[[file]]\nsource = 'a.exe'\ndestination = 'x'\n"
      "[[file]]\nname = 'A.exe'\ndestination = 'y'\nsource = ";
  ASSERT_EQ(Pack(twice + "'a.exe'\n").status, 0);
  ASSERT_EQ(Run("extract @new.exe -o @out").status, 0);
  EXPECT_EQ(NamesIn("out"), Names{"a.exe"});
  ASSERT_EQ(Pack(twice + "'b.dll'\n").status, 0);
  ExpectRefused(Run("extract @new.exe -o @new"), "two different files");
}

TEST_F(ImageExtractor, RefusesARemovalProgramAndBadUsage) {
  ASSERT_EQ(Run("removal @image.exe -o @removal.exe").status, 0);
  for (const char* commandLine :
       {"extract @removal.exe -o @new", "extract @image.exe -o @missing/out",
        "extract @image.exe -o @a.exe", "", "unpack", "list", "list @image.exe --all",
        "removal @image.exe -o @new --language latin"}) {
    ExpectRefused(Run(commandLine));
  }
  EXPECT_EQ(Run("extract --help").status, 0);
}

// Extraction: the packed files come back, and nothing is ever written elsewhere or left half-done.

#include "tools/image/image_extractor.h"

#include <memory>
#include <regex>
#include <string>

#include "tests/tools/tool_bench.h"
#include "tools/image/bad_input.h"
#include "tools/image/file_replacement.h"

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
  ASSERT_EQ(Run("extract @new.exe -o @second #2").status, 0);
  EXPECT_TRUE(Read("second/A.exe") == Read("b.dll"));
  ExpectRefused(Run("extract @new.exe -o @new #3"), "no file \"#3\"");
}

TEST_F(ImageExtractor, MakesATreeOfFirstPlaces) {
  const std::pair<const char*, const char*> rows[] = {
      {"%INSTALL_DIR%", "INSTALL_DIR/x"},
      {"a\\b;%SYS_DIR%", "INSTALL_DIR/a/b/x"},
      {"%REMOVE_DIR%inf\\", "REMOVE_DIR/inf/x"},
      {"%sysdir%\\moriv", "SYS_DIR/moriv/x"},
      {"c:\\", "C/x"},
      {"d:\\Data", "D/Data/x"},
      {"%PLUGIN_ALL_DIR%", "PLUGIN_ALL_DIR/x"},
      {"%PLUGIN_OPERA_DIR%sub", "PLUGIN_OPERA_DIR/sub/x"},
  };
  std::string description;
  for (const auto& [destination, path] : rows) {
    Write(std::string("sources/") + path, path);
    description += std::string("[[file]]\nname = 'x'\nsource = 'sources/") + path +
                   "'\ndestination = '" + destination + "'\n";
  }
  ASSERT_EQ(Pack(description).status, 0);
  ASSERT_EQ(Run("extract @new.exe -o @out --tree").status, 0);
  for (const auto& [destination, path] : rows) {
    EXPECT_EQ(Read(std::string("out/") + path), path);
  }
  // Nothing is left of a tree that can't be made whole, and no link leads out of it.
  std::filesystem::create_directory(Host("linked"));
  std::filesystem::create_directory_symlink(Host("sources"), Host("linked/PLUGIN_OPERA_DIR"));
  ExpectRefused(Run("extract @new.exe -o @linked --tree --force"), "is a link");
  EXPECT_EQ(NamesIn("linked"), Names{"PLUGIN_OPERA_DIR"});
  SetField(sample.pieces()[1].record.destination, "%INSTALL_DIR%\\..\\..");
  Write("image.exe", sample.RawBytes());
  ExpectRefused(Run("extract @image.exe -o @new --tree"), "leads elsewhere");
}

TEST_F(ImageExtractor, LooksForSpaceFirst) {
  sample.pieces().resize(3000, sample.pieces()[1]);
  for (ImageBuilder::Piece& piece : sample.pieces()) piece.record.fileSize = 0x7FFFFFFF;  // 6 TB
  Write("image.exe", sample.Bytes());
  ExpectRefused(Run("extract @image.exe -o @new"), " bytes free, the files need 6442");
}

TEST_F(ImageExtractor, PutsOldFilesBackWhenItFailsHalfWay) {
  for (const char* name : {"one", "two"}) Write(name, name);
  std::vector<std::unique_ptr<image::OutputFile>> files;
  for (const char* name : {"one", "new", "two"}) {
    files.push_back(std::make_unique<image::OutputFile>(Host(name), image::FileKind::kData));
  }
  std::filesystem::remove(files.back()->Temporary());
  EXPECT_THROW(image::CommitTogether(files), image::BadInput);
  files.clear();
  EXPECT_EQ(Read("one"), "one");
  EXPECT_EQ(Read("two"), "two");
  for (const std::string& name : NamesIn("."))
    EXPECT_TRUE(!name.starts_with(".moriv") && name != "new") << name;

  // A folder in the way is seen before anything is replaced.
  ASSERT_EQ(Run("extract @image.exe -o @out").status, 0);
  Write("out/a.exe", "old");
  std::filesystem::remove(Host("out/readme.txt"));
  std::filesystem::create_directory(Host("out/readme.txt"));
  ExpectRefused(Run("extract @image.exe -o @out --force"), "not a plain file");
  EXPECT_EQ(Read("out/a.exe"), "old");
}

TEST_F(ImageExtractor, RefusesARemovalProgramAndBadUsage) {
  ASSERT_EQ(Run("removal @image.exe -o @removal.exe").status, 0);
  for (const char* commandLine :
       {"extract @removal.exe -o @new", "extract @image.exe -o @missing/out",
        "extract @image.exe -o @a.exe", "", "unpack", "list", "list @image.exe --all",
        "removal @image.exe -o @new --language latin"}) {
    ExpectRefused(Run(commandLine));
  }
  ExpectRefused(Run("unpack @image.exe"), "unknown command \"unpack\"");
  ExpectRefused(Run("help unpack"), "unknown command \"unpack\"");
  EXPECT_EQ(Run("extract --help").out, Run("help extract").out);
  EXPECT_EQ(Run("--help").out, Run("help").out);
  EXPECT_TRUE(
      std::regex_match(Run("--version").out, std::regex("moriv-image \\d+\\.\\d+\\.\\d+\n")));
}

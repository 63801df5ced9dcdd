// Packing: what an image holds, and which descriptions, sources and stubs are refused.

#include "tools/image/image_builder.h"

#include <unistd.h>

#include <csignal>
#include <sstream>
#include <string>
#include <utility>

#include "tests/support/test_image.h"
#include "tests/tools/tool_bench.h"
#include "tools/image/output_file.h"
#include "tools/image/record_text.h"
#include "tools/image/temporary_files.h"

namespace {

class ImagePacking : public ToolBench {
 protected:
  ToolRun Pack(const std::string& description, const std::string& stub = "@stub.exe",
               const std::string& output = "@new.exe") const {
    return RunImage({"pack", description, "--stub", stub, "-o", output});
  }
  // A description of this text.
  ToolRun PackText(const std::string& text) const {
    Write("setup.toml", text);
    return Pack("@setup.toml");
  }
};

// A description whose one file has this destination, on line 3.
std::string WithDestination(const std::string& destination) {
  return "[[file]]\nsource = 'a.exe'\ndestination = '" + destination + "'\n";
}

std::string WithName(const std::string& name) {
  return "[[file]]\nsource = 'a.exe'\nname = \"" + name + "\"\ndestination = 'x'\n";
}

std::string WithDirectory(const std::string& directory) {
  return "[package]\ndefault_directory = '" + directory + "'\n" + WithDestination("%INSTALL_DIR%");
}

}  // namespace

TEST_F(ImagePacking, WritesEveryFieldOfHeaderAndRecords) {
  PackSample();
  const std::string stub = Read("stub.exe");
  const std::string image = Read("image.exe");
  EXPECT_TRUE(image.starts_with(stub));

  const PackageHeader header = HeaderOf("image.exe");
  EXPECT_EQ(header.headerSize, 568);
  EXPECT_STREQ(header.magic, "MORIV INSTALL DATA HEADER");
  EXPECT_EQ(header.recordCount, 3);
  EXPECT_EQ(header.removalImageFlag, 0);
  EXPECT_EQ(header.spaceNeeded, 48056u);
  EXPECT_EQ(header.packageLength, image.size() - stub.size());
  EXPECT_EQ(header.dataOffset, stub.size());
  EXPECT_STREQ(header.defaultDirectory, "C:\\Program Files\\Moriv");
  EXPECT_EQ(header.defaultLanguage, 10000);

  // Versions of the resource, as told, and none.
  const char* const rows[] = {"a.exe %INSTALL_DIR% 040c04b0 4.1.7 45056",
                              "b.dll %SYS_DIR%\\moriv;%PLUGIN_ALL_DIR% 040904b0 1.2.3 3000",
                              "readme.txt %INSTALL_DIR%\\docs  -1.-1.-1 0"};
  for (size_t i = 0; i < std::size(rows); ++i) {
    const FileRecord record = RecordOf("image.exe", i);
    std::ostringstream fields;
    fields << record.fileName << ' ' << record.destination << ' ' << record.versionLanguage << ' '
           << record.versionFirst << '.' << record.versionSecond << '.' << record.versionThird
           << ' ' << record.fileSize;
    EXPECT_EQ(fields.str(), rows[i]);
  }
  EXPECT_EQ(RecordOffset("image.exe", 3), image.size() - 568);
}

TEST_F(ImagePacking, DependsOnNothingButItsInputs) {
  PackSample();
  std::filesystem::create_directory(Host("elsewhere"));
  std::filesystem::copy_file(Host("setup.toml"), Host("elsewhere/other.toml"));
  const ToolRun run = RunImage({"pack", "@elsewhere/other.toml", "--stub", "@stub.exe", "-o",
                                "@second.exe", "--source-dir", "@"});
  ASSERT_EQ(run.status, 0) << run.err;
  EXPECT_TRUE(Read("image.exe") == Read("second.exe"));
}

TEST_F(ImagePacking, MakesASmallerImageWithBest) {
  PackSample();
  Write("a.exe", RandomBytes(20'000, 1) + std::string(40'000, 'x'));
  ASSERT_EQ(Pack("@setup.toml").status, 0);
  const ToolRun best =
      RunImage({"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@best.exe", "--best"});
  ASSERT_EQ(best.status, 0);
  EXPECT_LT(Read("best.exe").size(), Read("new.exe").size());
}

TEST_F(ImagePacking, LeavesNothingWhenItIsInterrupted) {
  const auto interrupt = [this] {
    image::DeleteTemporaryFilesOnSignal();
    const image::OutputFile one(Host("one.exe"), image::OutputFile::Kind::kProgram);
    const image::OutputFile two(Host("two.exe"), image::OutputFile::Kind::kProgram);
    if (NamesIn(".").size() == 2) kill(getpid(), SIGTERM);
    sleep(60);
  };
  EXPECT_EXIT(interrupt(), testing::KilledBySignal(SIGTERM), "");
  EXPECT_TRUE(NamesIn(".").empty());
}

TEST_F(ImagePacking, RefusesMoreThanTheFormatHolds) {
  PackSample();
  const std::string file = "[[file]]\nsource = 'empty.txt'\nname = 'x'\ndestination = '";
  std::string tooMany;
  for (int i = 0; i < 65536; ++i) tooMany += file + std::to_string(i) + "'\n";
  const uint64_t gibibyte = uint64_t{1} << 30;
  for (const auto& [name, size] : {std::pair{"half.bin", gibibyte}, {"whole.bin", 2 * gibibyte}}) {
    Write(name, "");
    std::filesystem::resize_file(Host(name), size);  // takes no room
  }
  const struct {
    std::string description, stub, said;
  } rows[] = {
      {tooMany, "@stub.exe", ":262142: more than 65535 files"},
      {"[[file]]\nsource = 'whole.bin'\ndestination = 'x'\n", "@stub.exe",
       "whole.bin: has 2 GiB or more"},
      {"[[file]]\nsource = 'half.bin'\ndestination = 'x'\n"
       "[[file]]\nsource = 'half.bin'\ndestination = 'y'\n",
       "@stub.exe", "2 GiB or more together"},
      {SampleDescription(), "@whole.bin", "whole.bin: has 2 GiB or more"},
  };
  Write("full.toml", "");
  for (const auto& [description, packedStub, said] : rows) {
    Write("full.toml", description);
    ExpectRefused(Pack("@full.toml", packedStub), said);
  }
}

TEST_F(ImagePacking, MakesARemovalProgramOfADescriptionThatSaysSo) {
  PackSample();
  std::string text = SampleDescription();
  Write("removal.toml", text.insert(text.find('\n') + 1, "removal = true\n"));
  ASSERT_EQ(Pack("@removal.toml").status, 0);
  EXPECT_EQ(RunImage({"removal", "@image.exe", "-o", "@cut.exe"}).status, 0);
  EXPECT_TRUE(Read("new.exe") == Read("cut.exe"));
}

TEST_F(ImagePacking, RefusesBadDescriptionsWithTheirLine) {
  PackSample();
  const std::string longPart(120, 'd');
  const struct {
    std::string text;
    int line;
    std::string said;
  } rows[] = {
      {"[package\n", 1, ""},
      {"[packages]\n", 1, "unknown key \"packages\""},
      {"[package]\nremoval = 1\n", 2, "removal"},
      {"[package]\nspace_needed = 4294967296\n", 2, "space_needed"},
      {"[package]\n\ntitle = 'x'\n", 3, "unknown key \"title\""},
      {"[package]\ndefault_language = 'latin'\n", 2, "default_language"},
      {"[package]\ndefault_directory = 5\n", 2, "default_directory"},
      {"file = 'a.exe'\n", 1, "[[file]]"},
      {"[[file]]\ndestination = 'x'\n", 1, "no \"source\""},
      {"\n[[file]]\nsource = 'a.exe'\n", 2, "no \"destination\""},
      {"[[file]]\nsource = 'a.exe'\ndestination = 'x'\nVersion = '1'\n", 4, "Version"},
      {"[[file]]\nsource = 'a.exe'\ndestination = 'x'\nversion = ''\n", 4, "version"},
      {"[[file]]\nsource = 'a.exe'\ndestination = 'x'\nlanguage = '040C04B0'\n", 4, "language"},
      {WithName("\\u4e00"), 3, "code page"},
      {WithName(""), 3, "empty"},
      {WithName(std::string(32, 'n')), 3, "at most 31"},
      {WithName("a\\\\b"), 3, "backslash"},
      {WithName("a/b"), 3, "/"},
      {WithName("a\\tb"), 3, "control"},
      {WithName("a?"), 3, "?"},
      {WithName("a."), 3, "point"},
      {WithName("a "), 3, "blank"},
      {WithName("nul"), 3, "device"},
      {WithName("LPT\\u00b2"), 3, "device"},
      {WithName("aux .c"), 3, "device"},
      {WithDestination(""), 3, "nowhere"},
      {WithDestination("%INSTALL_DIR%\\.."), 3, ".."},
      {WithDestination("a;b\\..\\c"), 3, ".."},
      {WithDestination("C:\\x\\..\\windows"), 3, ".."},
      {WithDestination("a/b"), 3, "/"},
      {WithDestination("a\\\\b"), 3, "empty folder name"},
      {WithDestination("a. \\b"), 3, "blank"},
      {WithDestination("C:"), 3, "in full"},
      {WithDestination("%INSTALL_DIR%\\C:"), 3, "no macro there"},
      {WithDestination("bin\\C:"), 3, "in full"},
      {WithDestination("%PLUGIN_ALL_DIR%\\C:"), 3, ":"},
      {WithDestination("%TARGET_DIR%\\x"), 3, "%TARGET_DIR%"},
      {WithDestination("x\\%INSTALL_DIR%"), 3, "%INSTALL_DIR%"},
      {WithDestination("%SYS-DIR%"), 3, "%SYS-DIR%"},
      {WithDestination("a;A\\"), 3, "fills"},
      {WithDestination("%INSTALL_DIR%\\bin;%CurDir%bin"), 3, "fills"},
      {WithDestination("%PLUGIN_OPERA_DIR%;%PLUGIN_ALL_DIR%"), 3, "fills"},
      {WithDestination(longPart + "\\" + longPart + "\\1234567890"), 3, "259"},
      {WithDestination(std::string(260, 'x')), 3, "259"},
      {WithDirectory("Moriv"), 2, "in full"},
      {WithDirectory("C:\\a\\..\\b"), 2, ".."},
      {WithDirectory("C:\\" + std::string(257, 'x')), 2, "259"},
      {WithDirectory("C:\\" + longPart + "\\" + longPart + "\\123456789"), 5, "259"},
      {WithName("a.exe") + WithName("A.EXE"), 8, "line 4"},
  };
  for (const auto& [text, line, said] : rows) {
    const ToolRun run = PackText(text);
    ExpectRefused(run, said);
    const std::string place = Host("setup.toml").string() + ":" + std::to_string(line) + ": ";
    EXPECT_TRUE(run.err.starts_with("moriv-image: " + place)) << text << run.err;
  }
}

TEST_F(ImagePacking, TakesWhatIsOnlyUnusual) {
  PackSample();
  // C:\ and 119 + 1 + 120 + 1 + 9 and \a.exe: a path of exactly 259.
  std::string longPath(250, 'd');
  longPath[119] = longPath[240] = '\\';
  for (const std::string& text :
       {WithDestination("\\a\\b\\"), WithDestination("D:\\Shared"), WithDestination(";a"),
        WithDestination("%sys_dir%sub;%Remove_Dir%\\x"), WithDestination("100% pure"),
        WithDestination("a;b;%PLUGIN_ALL_DIR%\\x"), WithDirectory(""), WithDirectory("C:\\"),
        WithDestination(longPath), WithName("console.exe"), WithName("com10"),
        WithName("\\u00e9t\\u00e9.txt")}) {
    const ToolRun run = PackText(text);
    EXPECT_EQ(run.status, 0) << text << run.err;
    EXPECT_EQ(RunImage({"verify", "@new.exe"}).status, 0) << text;
  }
  EXPECT_STREQ(RecordOf("new.exe", 0).fileName, "\xE9t\xE9.txt");  // in the code page
}

TEST_F(ImagePacking, RefusesStubsAndSourcesThatWillNotDo) {
  PackSample();
  Write("text.exe", "no program at all");
  Write("nameless.exe", ProgramWithStrings({{"FileVersion", "1.0"}}, false));
  Write("ageless.exe", ProgramWithStrings({}));
  Write("sourceless.toml", "[[file]]\nsource = 'missing.exe'\ndestination = 'x'\n");
  Write("folder.toml", "[[file]]\nsource = '.'\nname = 'x'\ndestination = 'x'\n");
  Write("fileless.toml", "[package]\n");
  const struct {
    std::string description, stub, output, said;
  } rows[] = {
      {"@setup.toml", "@image.exe", "@new.exe", "package behind it already"},
      {"@setup.toml", "@text.exe", "@new.exe", "no version resource"},
      {"@setup.toml", "@nameless.exe", "@new.exe", "no version resource"},
      {"@setup.toml", "@ageless.exe", "@new.exe", "no version resource"},
      {"@setup.toml", "@missing.exe", "@new.exe", "can't be opened"},
      {"@setup.toml", "@stub.exe", "@stub.exe", "input itself"},
      {"@setup.toml", "@stub.exe", "@missing/new.exe", "can't be written"},
      {"@missing.toml", "@stub.exe", "@new.exe", "can't be opened"},
      {"@sourceless.toml", "@stub.exe", "@new.exe", "can't be opened"},
      {"@folder.toml", "@stub.exe", "@new.exe", "not a plain file"},
      {"@fileless.toml", "@stub.exe", "@new.exe", "no file in it"},
  };
  for (const auto& [description, stub, output, said] : rows) {
    ExpectRefused(Pack(description, stub, output), said);
  }
}

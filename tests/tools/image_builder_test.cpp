// Packing: what an image holds, and which descriptions, sources and stubs are refused.

#include "tools/image/image_builder.h"

#include <unistd.h>

#include <csignal>
#include <regex>
#include <utility>

#include "tests/tools/tool_bench.h"
#include "tools/image/output_file.h"
#include "tools/image/temporary_files.h"

namespace {

using ImagePacking = SampleBench;

// Descriptions whose one file, or package, has this text: on line 3, or on line 2.
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

// Versions are those of the resource, as told, and none.
TEST_F(ImagePacking, FillsEveryFieldAsTheListingTells) {
  EXPECT_TRUE(Read("image.exe").starts_with(Read("stub.exe")));
  EXPECT_TRUE(sample.Bytes() == Read("image.exe"));  // no gap, and every size as it is
  EXPECT_EQ(sample.header().removalImageFlag, 0);
  const std::regex listing(R"(kind +setup image
records +3
space needed +48056
(.+\n)+default directory +"C:\\Program Files\\Moriv"
default language +french \(10000\)
(.*\n)+ *\d+ +\d+ +45056 +\d+ +4\.1\.7 +"040c04b0" +"a\.exe" +"%INSTALL_DIR%"
 *\d+ +\d+ +3000 +\d+ +1\.2\.3 +"040904b0" +"b\.dll" +"%SYS_DIR%\\moriv;%PLUGIN_ALL_DIR%"
 *\d+ +\d+ +0 +4 +-\.-\.- +"" +"readme\.txt" +"%INSTALL_DIR%\\docs"
)");
  const std::string listed = Run("list @image.exe").out;
  EXPECT_TRUE(std::regex_match(listed, listing)) << listed;
}

TEST_F(ImagePacking, DependsOnNothingButItsInputsAndIsSmallerWithBest) {
  Write("a.exe", Read("a.exe") + RandomBytes(20'000, 1) + std::string(40'000, 'x'));
  ASSERT_EQ(Pack("@setup.toml").status, 0);
  Write("elsewhere/other.toml", kDescription);
  ASSERT_EQ(Run("pack @elsewhere/other.toml --stub @stub.exe -o @two.exe --source-dir @").status,
            0);
  EXPECT_TRUE(Read("new.exe") == Read("two.exe"));
  ASSERT_EQ(Run("pack @setup.toml --stub @stub.exe -o @best.exe --best").status, 0);
  EXPECT_LT(Read("best.exe").size(), Read("new.exe").size());
}

TEST_F(ImagePacking, LeavesNothingWhenItIsInterrupted) {
  const std::vector<std::string> before = NamesIn(".");
  const auto interrupt = [&] {
    image::DeleteTemporaryFilesOnSignal();
    const image::OutputFile one(Host("one.exe"), image::OutputFile::Kind::kProgram);
    const image::OutputFile two(Host("two.exe"), image::OutputFile::Kind::kProgram);
    if (NamesIn(".").size() == before.size() + 2) kill(getpid(), SIGTERM);
    sleep(60);
  };
  EXPECT_EXIT(interrupt(), testing::KilledBySignal(SIGTERM), "");
  EXPECT_EQ(NamesIn("."), before);
}

TEST_F(ImagePacking, MakesARemovalProgramOfADescriptionThatSaysSo) {
  std::string text = kDescription;
  EXPECT_EQ(Pack(text.insert(text.find('\n') + 1, "removal = true\n")).status, 0);
  EXPECT_EQ(Run("removal @image.exe -o @cut.exe").status, 0);
  EXPECT_TRUE(Read("new.exe") == Read("cut.exe"));
}

TEST_F(ImagePacking, RefusesBadDescriptionsWithTheirLine) {
  const std::string part(120, 'd');
  const auto expectRefused = [this](const std::string& text, int line, const std::string& said) {
    const ToolRun run = Pack(text);
    ExpectRefused(run, said);
    const std::string where = Host("text.toml").string() + ":" + std::to_string(line) + ": ";
    EXPECT_TRUE(run.err.starts_with("moriv-image: " + where)) << text << run.err;
  };
  using Rows = std::vector<std::pair<const char*, std::vector<const char*>>>;
  for (const auto& [said, names] : Rows{{"code page", {"\\u4e00"}},
                                        {"empty", {""}},
                                        {"backslash", {"a\\\\b"}},
                                        {"/", {"a/b"}},
                                        {"control", {"a\\tb"}},
                                        {"?", {"a?"}},
                                        {"a blank or a point", {"a.", "a "}},
                                        {"device", {"nul", "LPT\\u00b2", "aux .c"}}}) {
    for (const char* name : names) expectRefused(WithName(name), 3, said);
  }
  for (const auto& [said, places] :
       Rows{{"nowhere", {""}},
            {"\"..\"", {"%INSTALL_DIR%\\..", "a;b\\..\\c", "C:\\x\\..\\windows"}},
            {"has a /", {"a/b"}},
            {"empty folder name", {"a\\\\b"}},
            {"blank", {"a. \\b"}},
            {"in full", {"C:", "bin\\C:"}},
            {"has a :", {"%PLUGIN_ALL_DIR%\\C:"}},
            {"no macro there",
             {"%INSTALL_DIR%\\C:", "%TARGET_DIR%\\x", "x\\%INSTALL_DIR%", "%SYS-DIR%"}},
            {"fills",
             {"a;A\\", "%INSTALL_DIR%\\bin;%CurDir%bin", "%PLUGIN_OPERA_DIR%;%PLUGIN_ALL_DIR%"}}}) {
    for (const char* place : places) expectRefused(WithDestination(place), 3, said);
  }
  const std::string file = "[[file]]\nsource = 'a.exe'\n";
  const std::tuple<std::string, int, const char*> rows[] = {
      {"[package\n", 1, ""},
      {"[packages]\n", 1, "unknown key \"packages\""},
      {"[package]\nremoval = 1\n", 2, "removal"},
      {"[package]\nspace_needed = 4294967296\n", 2, "space_needed"},
      {"[package]\n\ntitle = 'x'\n", 3, "unknown key \"title\""},
      {"[package]\ndefault_language = 'latin'\n", 2, "default_language"},
      {"[package]\ndefault_directory = 5\n", 2, "default_directory"},
      {"file = 'a.exe'\n", 1, "[[file]]"},
      {"[[file]]\ndestination = 'x'\n", 1, "no \"source\""},
      {"\n" + file, 2, "no \"destination\""},
      {file + "destination = 'x'\nVersion = '1'\n", 4, "Version"},
      {file + "destination = 'x'\nversion = ''\n", 4, "version"},
      {file + "destination = 'x'\nlanguage = '040C04B0'\n", 4, "language"},
      {WithName(std::string(32, 'n')), 3, "at most 31"},
      {WithDestination(part + "\\" + part + "\\1234567890"), 3, "259"},
      {WithDestination(std::string(260, 'x')), 3, "259"},
      {WithDirectory("Moriv"), 2, "in full"},
      {WithDirectory("C:\\a\\..\\b"), 2, ".."},
      {WithDirectory("C:\\" + std::string(257, 'x')), 2, "259"},
      {WithDirectory("C:\\" + part + "\\" + part + "\\123456789"), 5, "259"},
      {WithName("a.exe") + WithName("A.EXE"), 8, "line 4"},
  };
  for (const auto& [text, line, said] : rows) expectRefused(text, line, said);
}

TEST_F(ImagePacking, TakesWhatIsOnlyUnusual) {
  // C:\ and 119 + 1 + 120 + 1 + 9 and \a.exe: a path of exactly 259.
  std::string longPath(250, 'd');
  longPath[119] = longPath[240] = '\\';
  for (const std::string& text :
       {WithDestination("\\a\\b\\"), WithDestination("D:\\Shared"), WithDestination(";a"),
        WithDestination("%sys_dir%sub;%Remove_Dir%\\x"), WithDestination("100% pure"),
        WithDestination("a;b;%PLUGIN_ALL_DIR%\\x"), WithDirectory(""), WithDirectory("C:\\"),
        WithDestination(longPath), WithName("console.exe"), WithName("com10"),
        WithName("\\u00e9t\\u00e9.txt")}) {
    const ToolRun run = Pack(text);
    EXPECT_EQ(run.status, 0) << text << run.err;
    EXPECT_EQ(Run("verify @new.exe").status, 0) << text;
  }
  // In the code page.
  ImageBuilder last = ImageBuilder::TakenApart(Read("new.exe"));
  EXPECT_STREQ(last.pieces().at(0).record.fileName, "\xE9t\xE9.txt");
}

TEST_F(ImagePacking, RefusesStubsAndSourcesThatWillNotDo) {
  Write("text.exe", "no program at all");
  Write("nameless.exe", ProgramWithStrings({{"FileVersion", "1.0"}}, false));
  Write("ageless.exe", ProgramWithStrings({}));
  for (const auto& [name, gibibytes] : {std::pair{"half.bin", 1}, {"whole.bin", 2}}) {
    Write(name, "");
    std::filesystem::resize_file(Host(name), uint64_t(gibibytes) << 30);  // takes no room
  }
  const auto fileOf = [](const std::string& source) {
    return "[[file]]\nname = 'x'\nsource = '" + source + "'\ndestination = 'x'\n";
  };
  std::string tooMany;
  for (int i = 0; i < 65536; ++i)
    tooMany += "[[file]]\nsource = 'empty.txt'\ndestination = '" + std::to_string(i) + "'\n";
  const struct {
    std::string description, said, stub = "@stub.exe", output = "@new.exe";
  } rows[] = {
      {"@setup.toml", "package behind it already", "@image.exe"},
      {"@setup.toml", "no version resource", "@text.exe"},
      {"@setup.toml", "no version resource", "@nameless.exe"},
      {"@setup.toml", "no version resource", "@ageless.exe"},
      {"@setup.toml", "can't be opened", "@missing.exe"},
      {"@setup.toml", "whole.bin: has 2 GiB or more", "@whole.bin"},
      {"@setup.toml", "input itself", "@stub.exe", "@stub.exe"},
      {"@setup.toml", "can't be written", "@stub.exe", "@missing/new.exe"},
      {"@missing.toml", "can't be opened"},
      {fileOf("missing.exe"), "can't be opened"},
      {fileOf("."), "not a plain file"},
      {fileOf("whole.bin"), "whole.bin: has 2 GiB or more"},
      {fileOf("half.bin") + "[[file]]\nsource = 'half.bin'\ndestination = 'y'\n",
       "2 GiB or more together"},
      {"[package]\n", "no file in it"},
      {tooMany, ":196607: more than 65535 files"},
  };
  for (const auto& [description, said, stub, output] : rows)
    ExpectRefused(Pack(description, stub, output), said);
}

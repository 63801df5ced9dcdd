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
std::string Repeated(const std::string& text, int count) {
  std::string repeated;
  while (count-- > 0) repeated += text;
  return repeated;
}
std::string WithVersion(const std::string& version) {
  return "[[file]]\nsource = 'a.exe'\nversion = '" + version + "'\ndestination = 'x'\n";
}
std::string WithDirectory(const std::string& directory) {
  return "[package]\ndefault_directory = '" + directory + "'\n" + WithDestination("%INSTALL_DIR%");
}

}  // namespace

// Versions are those of the resource, those that the description gives, and none.
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
  std::string bytes = Read("a.exe");
  for (const unsigned seed : {1u, 1u, 1u, 1u, 2u, 2u, 2u, 2u}) bytes += RandomBytes(9'000, seed);
  Write("a.exe", bytes);
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
    image::DeleteTemporaryFilesWhenStopped();
    const image::OutputFile one(Host("one.exe"), image::FileKind::kProgram);
    const image::OutputFile two(Host("two.exe"), image::FileKind::kProgram);
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
                                        {"control", {"a\\tb", "a\\u007f"}},
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
            {"a lone %", {"100% pure", "%INSTALL_DIR%\\50%", "C:\\a%\\b", "%INSTALL_DIR\\x"}},
            {"fills",
             {"a;A\\", "%INSTALL_DIR%\\bin;%CurDir%bin", "%PLUGIN_OPERA_DIR%;%PLUGIN_ALL_DIR%"}}}) {
    for (const char* place : places) expectRefused(WithDestination(place), 3, said);
  }
  for (const char* version :
       {"", "1.2", "1.2.3.4", "1..2", "-1.2.3", " 1.2.3", "1.2.32768", "1.2.x"})
    expectRefused(WithVersion(version), 3, "three numbers");
  const std::string file = "[[file]]\nsource = 'a.exe'\n";
  const auto toOwnPlace = [](const std::string& name, const std::string& destination) {
    return "[[file]]\nsource = 'a.exe'\nname = '" + name + "'\ndestination = '" + destination +
           "'\n";
  };
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
      {toOwnPlace("morivrmv.exe", "x;%REMOVEDIR%\\"), 4, "own removal program"},
      {toOwnPlace("MorivLog.txt", "C:\\Windows"), 4, "own log"},
      {toOwnPlace("Moriv.INF", "%REMOVE_DIR%"), 4, "after a removal"},
      {"[[file]]\nsource = 'bin\\a.exe'\ndestination = 'x'\n", 2, "write / between folders"},
      {file + "destination = []\n", 3, "empty list"},
      {file + "destination = ['x', 5]\n", 3, "text in quotes"},
      {file + "destination = ['x;y']\n", 3, "within an element"},
      {"[[file]]\nsource = '*.none'\ndestination = 'x'\n", 2, "matches no file"},
      {"[[file]]\nsource = 'none/*'\ndestination = 'x'\n", 2, "can't be read"},
      {"[[file]]\nsource = '*.exe'\nname = 'x'\ndestination = 'x'\n", 3, "with a pattern"},
      {"[[tree]]\nsource = 'a.exe'\ndestination = 'x'\n", 2, "can't be read"},
      {"[[tree]]\nsource = '.'\ndestination = 'x'\nname = 'x'\n", 4, "unknown key"},
      {"a" + Repeated(".a", 40'000) + " = 1\n", 1, "nested too deep"},
      {"#[[[[\n\"[{\" = " + Repeated("[", 100'000) + "\n", 2, "nested too deep"},
      {"a = " + Repeated("9", 100'000) + "\n", 1, ""},
      {std::string("a = '\0'\n", 8), 1, ""},
      {"\na = '\xFF'\n", 2, "utf-8"},
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
        WithDestination("%sys_dir%sub;%Remove_Dir%\\x"), WithDestination("a;b;%PLUGIN_ALL_DIR%\\x"),
        WithDirectory(""), WithDirectory("C:\\"), WithDestination(longPath),
        WithVersion("32767.0.007"), WithName("console.exe"), WithName("com10"),
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
  Write("mere.exe", VersionedProgram("1.0.0"));
  Write("other.exe", SetupStub("OtherLog.txt"));
  Write("longer.exe", SetupStub() + "12345");
  const size_t certificates = 64 + 24 + 96 + 4 * 8;
  Write("signed.exe", SetupStub().replace(certificates, 4, ByteBuilder().U32(512).bytes()));
  std::filesystem::create_hard_link(Host("a.exe"), Host("linked.exe"));
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
      {"@setup.toml", "another program", "@mere.exe"},
      {"@setup.toml", "another program", "@other.exe"},
      {"@setup.toml", "5 bytes behind its last section", "@longer.exe"},
      {"@setup.toml", "a signature", "@signed.exe"},
      {"@setup.toml", "can't be opened", "@missing.exe"},
      {"@setup.toml", "whole.bin: has 2 GiB or more", "@whole.bin"},
      {"@setup.toml", "input itself", "@stub.exe", "@stub.exe"},
      {"@setup.toml", "input itself", "@stub.exe", "@setup.toml"},
      {"@setup.toml", ":6: \"source\" \"a.exe\" is the output", "@stub.exe", "@linked.exe"},
      {"@setup.toml", "is no file", "@stub.exe", "-"},
      {"@setup.toml", "input itself", "@stub.exe", "@new.exe --depfile @stub.exe"},
      {"@setup.toml", "is the file of --depfile", "@stub.exe", "@new.exe --depfile @b.dll"},
      {"@setup.toml", "name another --depfile", "@stub.exe", "@new.exe --depfile @new.exe"},
      {"@setup.toml", "can't be written", "@stub.exe", "@missing/new.exe"},
      {"@missing.toml", "can't be opened"},
      {fileOf("missing.exe"), ":3: \"source\": " + Host("missing.exe").string() + ": can't be"},
      {fileOf("."), "not a plain file"},
      {fileOf("whole.bin"), "whole.bin: has 2 GiB or more"},
      {fileOf("half.bin") + "[[file]]\nsource = 'half.bin'\ndestination = 'y'\n",
       "2 GiB or more together"},
      {"[package]\n", "no file in it"},
      {tooMany, ":196607: \"source\": more than 65535 files"},
  };
  const auto inputs = [&] {
    return Read("a.exe") + Read("stub.exe") + Read("setup.toml") + Read("b.dll");
  };
  const std::string before = inputs();
  for (const auto& [description, said, stub, output] : rows)
    ExpectRefused(Pack(description, stub, output), said);
  EXPECT_TRUE(inputs() == before);
}

// Twenty faults of texts, sources and stub, in the order of their lines; the last tells of the
// rest.
TEST_F(ImagePacking, TellsAllFaultsAtOnce) {
  const std::string file = "[[file]]\nsource = 'missing'\ndestination = '..'\nversion = '1'\n";
  ToolRun run = Pack("[package]\nremoval = 5\n" + Repeated(file, 12), "@a.exe");
  ExpectRefused(run, " (and 18 more)\n");
  const std::string where = "moriv-image: " + Host("text.toml").string() + ':';
  std::istringstream lines(run.err);
  std::string told;
  for (size_t i = 0; i < 20; ++i) {
    const size_t line = i == 0 ? 2 : 4 + (i - 1) / 3 * 4 + (i - 1) % 3;
    std::getline(lines, told);
    EXPECT_TRUE(told.starts_with(where + std::to_string(line) + ": \"")) << told;
  }
  EXPECT_FALSE(std::getline(lines, told)) << told;
  run = Pack(file, "@a.exe");
  EXPECT_NE(run.err.find("text.toml:4: \"version\""), std::string::npos) << run.err;
  EXPECT_NE(run.err.find("a.exe: has 44192 bytes behind"), std::string::npos) << run.err;
}

TEST_F(ImagePacking, WarnsOfWhatIsTakenAllTheSame) {
  Write("comma.exe", ProgramWithStrings({{"FileVersion", "3, 44, 6, 2"}}));
  Write("short.exe", ProgramWithStrings({{"FileVersion", "v1.2"}}));
  const std::string two = WithDestination("%INSTALL_DIR%\\one\\two");
  const std::string one = WithDestination("%CURDIR%\\ONE\\");
  const std::tuple<std::string, int, const char*> rows[] = {
      {WithDestination("a;C:\\windows\\"), 3, "write \"%REMOVE_DIR%\""},
      {WithDestination("c:\\winnt\\system32\\x"), 3, "write \"%SYS_DIR%\\x\""},
      {WithDestination("C:\\Program Files\\Moriv\\x"), 3, "write \"%INSTALL_DIR%\\x\""},
      {WithDirectory("D:\\P") + WithDestination("d:\\p\\q"), 8, "write \"%INSTALL_DIR%\\q\""},
      {WithDestination("C:\\;C:\\windows2;x"), 3, "leaves \"C:\\windows2\" behind"},
      {two, 3, "leaves \"%INSTALL_DIR%\\one\" behind"},
      {one + two, 6, "let a file with the destination \"%CURDIR%\\ONE\" follow"},
      {two + one, 0, ""},
      {WithDestination("%PLUGIN_ALL_DIR%\\a\\b;%PLUGIN_IE_DIR%\\c"), 3,
       "%PLUGIN_ALL_DIR%\\a\" behind"},
      {"[[file]]\nsource = 'comma.exe'\ndestination = 'x'\n", 2, "reads as 3.0.0"},
      {"[[file]]\nsource = 'short.exe'\ndestination = 'x'\n", 2, "write it into the file as 1.2.0"},
  };
  for (const auto& [text, line, said] : rows) {
    const ToolRun run = Pack(text);
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(std::ranges::count(run.err, '\n'), line == 0 ? 0 : 1) << text << run.err;
    const std::string where = line == 0 ? "" : "text.toml:" + std::to_string(line) + ": \"";
    EXPECT_NE(run.err.find(where), std::string::npos) << text << run.err;
    EXPECT_NE(run.err.find(said), std::string::npos) << text << run.err;
  }
}

// In the order of the text, and what one entry stands for in the order of its bytes.
TEST_F(ImagePacking, TakesPatternsTreesAndListsAndReportsThem) {
  for (const char* name : {"bin/b.dll", "bin/a.dll", "bin/a-b.dll", "bin/é.dll", "bin/c.dll/x.dll",
                           "data/z.txt", "data/a b/$#.txt", "data/a/.x", "elsewhere/x.txt"}) {
    Write(name, name);
  }
  std::filesystem::create_symlink("../z.txt", Host("data/a/link"));
  const std::string tree = "[[tree]]\nsource = 'data/'\ndestination = ['%SYS_DIR%\\', 'd', '']\n";
  const std::string pattern =
      "[[file]]\nsource = 'b*n/?.dl*l'\ndestination = 'x'\nversion = '1.2.3'\n";
  const ToolRun run = Pack(tree + WithDestination("%INSTALL_DIR%") + pattern, "@stub.exe",
                           "@new.exe --verbose --depfile @new.d");
  ASSERT_EQ(run.status, 0) << run.err;
  const std::regex report(R"( +15 -> +\d+ +\d+\.\d %  "\$#\.txt"  "%SYS_DIR%\\a b;d\\a b;\\a b"
 +9 -> .+"\.x"  "%SYS_DIR%\\a;d\\a;\\a"
 +10 -> .+"link"  "%SYS_DIR%\\a;d\\a;\\a"
 +10 -> .+"z\.txt"  "%SYS_DIR%\\;d;;"
 +45056 -> .+"a\.exe"  "%INSTALL_DIR%"
 +9 -> .+"a\.dll"  "x"
 +9 -> .+"b\.dll"  "x"
 +10 -> .+"é\.dll"  "x"
 +45128 -> +\d+ +\d+\.\d %  8 files, (\d+) bytes of image
)");
  std::smatch match;
  ASSERT_TRUE(std::regex_match(run.out, match, report)) << run.out;
  EXPECT_EQ(match[1], std::to_string(Read("new.exe").size()));
  // Each byte of the tree three times, for its places.
  const ImageBuilder image = ImageBuilder::TakenApart(Read("new.exe"));
  EXPECT_EQ(ImageBuilder(image).header().spaceNeeded, 45128u + 2 * 44);
  const std::string rule = Read("new.d");
  EXPECT_TRUE(rule.starts_with(Host("new.exe").string() + ": \\\n  " + Host("text.toml").string()));
  EXPECT_NE(rule.find(Host("data").string() + "/a\\ b/$$\\#.txt \\\n"), std::string::npos) << rule;
  EXPECT_EQ(Pack(tree, "@stub.exe", "@new.exe --quiet").out, "");

  std::filesystem::create_symlink("../../elsewhere/x.txt", Host("data/a/out"));
  ExpectRefused(Pack(tree), ":2: \"source\": " + Host("data/a/out").string() + ": is a link");
  std::filesystem::remove(Host("data/a/out"));
  Write("data/a;b/x", "");
  ExpectRefused(Pack(tree), "means something else");
}

// The descriptions of docs/image-tool.md are packed without a warning, and its message is what is
// said.
TEST_F(ImagePacking, IsAsItsDocumentShowsIt) {
  for (const char* name : {"zebdial.exe", "plug-in.dll", "lib/net.dll", "data/fonts/small.fon",
                           "data/read.me", "deep.dat", "flat.dat"}) {
    Write(name, name);
  }
  std::istringstream document(FileBytes(MORIV_SOURCE_DIR "/docs/image-tool.md"));
  std::string block, listings, messages;
  for (std::string line; std::getline(document, line);) {
    if (line.starts_with("    moriv-image: package.toml:10:")) messages += line.substr(4) + '\n';
    if (line.empty() || line.starts_with("    ")) {
      block += line + '\n';
    } else if (const std::string text = std::exchange(block, ""); text.find("[[") != text.npos) {
      const ToolRun run = Pack(text);
      EXPECT_EQ(std::pair(run.status, run.err), std::pair(0, std::string())) << text;
      listings += Run("list @new.exe").out;
    }
  }
  EXPECT_TRUE(
      std::regex_search(listings, std::regex(R"("small.fon" +"%INSTALL_DIR%\\data\\fonts")")));
  EXPECT_NE(listings.find("\"%INSTALL_DIR%\\one\\two\""), std::string::npos) << listings;
  Write("package.toml", std::string(7, '\n') + WithDestination("%INSTALL_DIR%\\data;%SYSTEM%"));
  const std::string said = Pack("@package.toml").err;
  EXPECT_EQ(std::regex_replace(said, std::regex(Host("").string()), ""), messages);
}

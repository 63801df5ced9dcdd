// Verify and removal: a good image is good, and each thing that is wrong is found.

#include <functional>
#include <utility>

#include "tests/tools/tool_bench.h"
#include "tools/image/language_names.h"

struct ImageVerifier : SampleBench {
  // What verify says is wrong.
  std::vector<std::string> WrongIn(const std::string& image) const {
    const ToolRun run = Run("verify " + image);
    std::vector<std::string> wrong;
    std::istringstream lines(run.out);
    for (std::string line; std::getline(lines, line);) {
      if (line.starts_with("wrong  ")) wrong.push_back(line.substr(7));
    }
    EXPECT_EQ(run.status, wrong.empty() ? 0 : 1);
    return wrong;
  }
};

// Each row changes one thing: of the header, of the second record, of the rest.
TEST_F(ImageVerifier, FindsEachChange) {
  struct Parts {
    ImageBuilder& image;
    PackageHeader& header;
    FileRecord& record;
  };
  const auto withSize = [](uint32_t size) {
    return [size](Parts p) {
      p.record.fileSize = size;
      p.header.spaceNeeded += size - 3000;
    };
  };
  const std::pair<std::function<void(Parts)>, const char*> rows[] = {
      {[](Parts p) { p.header.removalImageFlag = 2; }, "removalImageFlag is 2"},
      {[](Parts p) { p.header.spaceNeeded--; }, "spaceNeeded is 48055"},
      {[](Parts p) { p.header.packageLength--; }, "packageLength"},
      {[](Parts p) { p.header.defaultDirectory[259] = 'x'; }, "defaultDirectory"},
      {[](Parts p) { SetField(p.header.defaultDirectory, "C:\\..\\x"); }, "\"..\""},
      {[](Parts p) { p.header.defaultLanguage = 5; }, "defaultLanguage 5"},
      {[](Parts p) { p.header.reserved[259] = 1; }, "reserved"},
      {[](Parts p) { p.header.recordCount = 4; }, "record 4 at offset"},
      {[](Parts p) { p.header.dataOffset++; }, "recordSize"},
      {[](Parts p) { p.header.dataOffset = 0xFFFFFFFF; }, "dataOffset 4294967295"},
      {[](Parts p) { p.header.headerSize = 567; }, "no package header"},
      {[](Parts p) { p.header.magic[25] = 'x'; }, "no package header"},
      {[](Parts p) { p.record.recordSize = 695; }, "recordSize of 695"},
      {[](Parts p) { p.record.fileName[31] = 'x'; }, "fileName does not end"},
      {[](Parts p) { p.record.destination[259] = 'x'; }, "destination does not end"},
      {[](Parts p) { p.record.versionLanguage[127] = 'x'; }, "versionLanguage does not end"},
      {[](Parts p) { p.record.versionLanguage[0] = 'G'; }, "versionLanguage \"G4"},
      {[](Parts p) { p.record.reserved[0] = 1; }, "reserved"},
      {[](Parts p) { p.record.fileName[0] = '/'; }, "fileName \"/"},
      {[](Parts p) { SetField(p.record.destination, ""); }, "nowhere"},
      {[](Parts p) { p.record.storedSize = 0xFFFFFFFF; }, "reaches into the header"},
      {[](Parts p) {
         SetField(p.record.fileName, "a.exe");
         SetField(p.record.destination, "\\");
       },
       "record 1 fills already"},
      {[](Parts p) { SetField(p.record.destination, std::string(259, ';')); },
       "goes to one place twice"},
      {withSize(2999), "expands to more than"},
      {withSize(3001), "expands to 3000 bytes"},
      {withSize(0x80000000), "2 GiB or more"},
      {[](Parts p) { p.image.pieces()[1].stream[0] = 'p'; }, "does not begin with"},
      {[](Parts p) {
         p.image.pieces()[2].stream += '\0';
         p.header.packageLength++;
       },
       "1 bytes stand between"},
      {[](Parts p) { p.image.executable()[0] = 'X'; }, "no version resource"},
      {[](Parts p) {
         p.image.executable().clear();
         p.header.dataOffset = 0;
       },
       "no executable"},
  };
  for (const auto& [change, part] : rows) {
    ImageBuilder image = sample;
    change({image, image.header(), image.pieces()[1].record});
    Write("image.exe", image.RawBytes());
    const std::vector<std::string> wrong = WrongIn("@image.exe");
    ASSERT_EQ(wrong.size(), 1u) << part << ": " << (wrong.empty() ? "" : wrong[1]);
    EXPECT_NE(wrong[0].find(part), std::string::npos) << part << ": " << wrong[0];
  }
}

TEST_F(ImageVerifier, KnowsTheRulesOfRemovalPrograms) {
  EXPECT_TRUE(WrongIn("@image.exe").empty());
  ASSERT_EQ(Run("removal @image.exe -o @removal.exe --language german").status, 0);
  EXPECT_TRUE(WrongIn("@removal.exe").empty());
  ExpectRefused(Run("removal @removal.exe -o @again.exe"));

  sample.header().removalImageFlag = 1;
  sample.header().packageLength = 3 * sizeof(FileRecord);
  Write("image.exe", sample.RawBytes());
  EXPECT_EQ(WrongIn("@image.exe").size(), 3u);  // each record has a stream
  sample.header().defaultLanguage = 20000;
  for (ImageBuilder::Piece& piece : sample.pieces()) {
    piece.stream.clear();
    piece.record.storedSize = 0;
  }
  EXPECT_TRUE(Read("removal.exe") == sample.RawBytes());
}

TEST_F(ImageVerifier, TellsWhatIsAskedForOfSeveralImages) {
  const std::string good = Host("image.exe").string(), bad = Host("bad.exe").string();
  sample.header().defaultLanguage = 5;
  Write("bad.exe", sample.RawBytes());
  const std::string wrong =
      "wrong  header: defaultLanguage 5 is none of " + std::string(image::kLanguageNames);
  EXPECT_EQ(Run("verify --quiet @image.exe").out, "6 parts, none wrong\n");
  EXPECT_EQ(Run("verify --quiet @bad.exe").out, wrong + "\n6 parts, 1 wrong\n");
  const ToolRun both = Run("verify --quiet @image.exe @bad.exe");
  EXPECT_EQ(both.status, 1);
  EXPECT_EQ(both.out, wrong + "  in " + bad + "\n2 images, 12 parts, 1 wrong\n");
  ExpectRefused(Run("verify @image.exe @missing.exe"), "can't be opened");

  // More than the sizes may be asked for; less than the certain places need is noted.
  ASSERT_EQ(Pack("[package]\nspace_needed = 50000\n[[file]]\nsource = 'a.exe'\n"
                 "destination = 'a;b'\n")
                .status,
            0);
  const std::string note =
      "note   regions: spaceNeeded is 50000, the files in all their certain "
      "places need 90112\nok     regions\n";
  const ToolRun run = Run("verify @new.exe");
  EXPECT_EQ(run.status, 0);
  EXPECT_NE(run.out.find(note), std::string::npos) << run.out;
  EXPECT_EQ(Run("verify --quiet @new.exe").out, "4 parts, none wrong\n");
}

TEST_F(ImageVerifier, ComparesWithTheSources) {
  const std::string against = "verify --quiet @image.exe --against @setup.toml";
  EXPECT_EQ(Run(against).out, "6 parts, none wrong\n");
  const std::string description = kDescription;
  const auto with = [&description](const std::string& from, const std::string& to) {
    return std::string(description).replace(description.find(from), from.size(), to);
  };
  std::string changed = Read("b.dll");
  changed[2999] ^= 1;
  Write("changed/b.dll", changed);
  Write("longer/b.dll", Read("b.dll") + "x");
  const std::pair<std::string, const char*> rows[] = {
      {with("Moriv", "Zeb"), "header: defaultDirectory is \"C:\\Program Files\\Moriv\", the "},
      {with("french", "german"), "header: defaultLanguage is french (10000), the"},
      {with("\"french\"", "\"french\"\nspace_needed = 9"), "header: spaceNeeded is 48056, the"},
      {with("\"french\"", "\"french\"\nremoval = true"), "header: it is no removal program"},
      {with("readme.txt", "r.txt"), "record 3 \"readme.txt\": fileName is"},
      {with("\\docs", "\\doc"), "record 3 \"readme.txt\": destination is"},
      {with("1.2.3", "1.2.4"),
       "record 2 \"b.dll\": the version is 1.2.3, the sources make it 1.2.4"},
      {with("040904b0", "040704b0"), "record 2 \"b.dll\": versionLanguage is"},
      {with("b.dll", "changed/b.dll"), "b.dll at byte 2999"},
      {with("b.dll", "longer/b.dll"), "longer/b.dll has 3001"},
  };
  for (const auto& [text, said] : rows) {
    Write("other.toml", text);
    const ToolRun run = Run("verify --quiet @image.exe --against @other.toml");
    EXPECT_EQ(run.status, 1) << run.err;
    EXPECT_NE(run.out.find(said), std::string::npos) << said << ": " << run.out;
  }
  std::filesystem::create_directory(Host("empty"));
  ExpectRefused(Run(against + " --source-dir @empty"), "can't be opened");
  ExpectRefused(Run(against + " @image.exe"), "goes with one image");
}

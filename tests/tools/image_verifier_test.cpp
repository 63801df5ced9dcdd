// Verify and removal: a good image is good, and each thing that is wrong is found.

#include <functional>
#include <utility>

#include "tests/tools/tool_bench.h"

namespace {

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

}  // namespace

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
       "filled already"},
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

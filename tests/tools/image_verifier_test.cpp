// Verify and removal: a good image is good, and each thing that is wrong is found.

#include <functional>
#include <utility>

#include "tests/tools/tool_bench.h"

namespace {

class ImageVerifier : public SampleBench {
 protected:
  // What verify says is wrong.
  std::vector<std::string> WrongIn(const std::string& image) const {
    const ToolRun run = Run({"verify", image});
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
  using Header = PackageHeader&;
  using Record = FileRecord&;
  using Image = ImageBuilder&;
  const auto inHeader = [](void (*change)(Header)) {
    return [change](Image image) { change(image.header()); };
  };
  const auto inRecord = [](void (*change)(Record)) {
    return [change](Image image) { change(image.pieces()[1].record); };
  };
  const auto withSize = [](uint32_t size) {
    return [size](Image image) {
      image.pieces()[1].record.fileSize = size;
      image.header().spaceNeeded += size - 3000;
    };
  };
  const std::pair<std::function<void(Image)>, const char*> rows[] = {
      {inHeader([](Header h) { h.removalImageFlag = 2; }), "removalImageFlag is 2"},
      {inHeader([](Header h) { h.spaceNeeded++; }), "spaceNeeded is 48057"},
      {inHeader([](Header h) { h.packageLength--; }), "packageLength"},
      {inHeader([](Header h) { h.defaultDirectory[259] = 'x'; }), "defaultDirectory"},
      {inHeader([](Header h) { SetField(h.defaultDirectory, "C:\\..\\x"); }), "\"..\""},
      {inHeader([](Header h) { h.defaultLanguage = 5; }), "defaultLanguage 5"},
      {inHeader([](Header h) { h.reserved[259] = 1; }), "reserved"},
      {inHeader([](Header h) { h.recordCount = 4; }), "record 4 at offset"},
      {inHeader([](Header h) { h.dataOffset++; }), "recordSize"},
      {inHeader([](Header h) { h.dataOffset = 0xFFFFFFFF; }), "dataOffset 4294967295"},
      {inHeader([](Header h) { h.headerSize = 567; }), "no package header"},
      {inHeader([](Header h) { h.magic[25] = 'x'; }), "no package header"},
      {inRecord([](Record r) { r.recordSize = 695; }), "recordSize of 695"},
      {inRecord([](Record r) { r.fileName[31] = 'x'; }), "fileName does not end"},
      {inRecord([](Record r) { r.destination[259] = 'x'; }), "destination does not end"},
      {inRecord([](Record r) { r.versionLanguage[127] = 'x'; }), "versionLanguage does not end"},
      {inRecord([](Record r) { r.versionLanguage[0] = 'G'; }), "versionLanguage \"G4"},
      {inRecord([](Record r) { r.reserved[0] = 1; }), "reserved"},
      {inRecord([](Record r) { r.fileName[0] = '/'; }), "fileName \"/"},
      {inRecord([](Record r) { SetField(r.destination, ""); }), "nowhere"},
      {inRecord([](Record r) { r.storedSize = 0xFFFFFFFF; }), "reaches into the header"},
      {inRecord([](Record r) {
         SetField(r.fileName, "a.exe");
         SetField(r.destination, "\\");
       }),
       "filled already"},
      {withSize(2999), "expands to more than"},
      {withSize(3001), "expands to 3000 bytes"},
      {withSize(0x80000000), "2 GiB or more"},
      {[](Image image) { image.pieces()[1].stream[0] = 'p'; }, "does not begin with"},
      {[](Image image) {
         image.pieces()[2].stream += '\0';
         image.header().packageLength++;
       },
       "1 bytes stand between"},
      {[](Image image) { image.executable()[0] = 'X'; }, "no version resource"},
      {[](Image image) {
         image.executable().clear();
         image.header().dataOffset = 0;
       },
       "no executable"},
  };
  for (const auto& [change, part] : rows) {
    ImageBuilder image = sample;
    change(image);
    Write("image.exe", image.RawBytes());
    const std::vector<std::string> wrong = WrongIn("@image.exe");
    ASSERT_EQ(wrong.size(), 1u) << part << ": " << (wrong.empty() ? "" : wrong[1]);
    EXPECT_NE(wrong[0].find(part), std::string::npos) << part << ": " << wrong[0];
  }
}

TEST_F(ImageVerifier, KnowsTheRulesOfRemovalPrograms) {
  EXPECT_TRUE(WrongIn("@image.exe").empty());
  ASSERT_EQ(Run({"removal", "@image.exe", "-o", "@removal.exe", "--language", "german"}).status, 0);
  EXPECT_TRUE(WrongIn("@removal.exe").empty());
  ExpectRefused(Run({"removal", "@removal.exe", "-o", "@again.exe"}));

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

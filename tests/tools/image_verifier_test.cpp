// Verify, list and removal: a good image is good, and each thing that is wrong is found.

#include "tools/image/image_verifier.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <string>

#include "tests/tools/tool_bench.h"

namespace {

class ImageVerifier : public ToolBench {
 protected:
  std::vector<std::string> WrongIn(const std::string& image) const {
    std::vector<std::string> wrong;
    for (const image::Finding& finding : image::VerifyImage(Host(image))) {
      if (!finding.isGood) wrong.push_back(finding.text);
    }
    return wrong;
  }

  // image.exe as it is now has this one thing wrong.
  void ExpectWrong(const std::string& part) const {
    const std::vector<std::string> wrong = WrongIn("image.exe");
    ASSERT_EQ(wrong.size(), 1u) << part << ": " << (wrong.empty() ? "" : wrong[1 % wrong.size()]);
    EXPECT_NE(wrong[0].find(part), std::string::npos) << wrong[0];
    const ToolRun run = RunImage({"verify", "@image.exe"});
    EXPECT_EQ(run.status, 1);
    EXPECT_NE(run.out.find("wrong  " + wrong[0] + "\n"), std::string::npos);
  }
};

}  // namespace

TEST_F(ImageVerifier, FindsNothingInAGoodImageAndListsIt) {
  PackSample();
  const ToolRun verified = RunImage({"verify", "@image.exe"});
  EXPECT_EQ(verified.status, 0);
  EXPECT_EQ(verified.out.find("wrong"), std::string::npos) << verified.out;
  EXPECT_EQ(std::count(verified.out.begin(), verified.out.end(), '\n'), 6);
  const ToolRun listed = RunImage({"list", "@image.exe"});
  EXPECT_EQ(listed.status, 0);
  for (const char* part : {"setup image", "48056", "french (10000)", "\"C:\\Program Files\\Moriv\"",
                           "4.1.7", "\"040c04b0\"", "\"readme.txt\"", "-.-.-"}) {
    EXPECT_NE(listed.out.find(part), std::string::npos) << part;
  }
}

TEST_F(ImageVerifier, FindsEachChangeOfTheHeader) {
  using Change = void (*)(PackageHeader*);
  const struct {
    Change change;
    const char* part;
  } rows[] = {
      {[](PackageHeader* h) { h->removalImageFlag = 2; }, "removalImageFlag is 2"},
      {[](PackageHeader* h) { h->spaceNeeded++; }, "spaceNeeded is 48057"},
      {[](PackageHeader* h) { h->packageLength--; }, "packageLength"},
      {[](PackageHeader* h) { std::memset(h->defaultDirectory + 200, 'x', 60); },
       "defaultDirectory"},
      {[](PackageHeader* h) { std::strcpy(h->defaultDirectory, "C:\\Program Files\\..\\x"); },
       "\"..\""},
      {[](PackageHeader* h) { h->defaultLanguage = 5; }, "defaultLanguage 5"},
      {[](PackageHeader* h) { h->reserved[259] = 1; }, "reserved"},
      {[](PackageHeader* h) { h->recordCount = 4; }, "record 4 at offset"},
      {[](PackageHeader* h) { h->dataOffset++; }, "recordSize"},
      {[](PackageHeader* h) { h->dataOffset = 0xFFFFFFFF; }, "dataOffset 4294967295"},
      {[](PackageHeader* h) { h->headerSize = 567; }, "no package header"},
      {[](PackageHeader* h) { h->magic[25] = 'x'; }, "no package header"},
  };
  for (const auto& row : rows) {
    PackSample();
    ChangeHeader(row.change);
    ExpectWrong(row.part);
  }
}

TEST_F(ImageVerifier, FindsEachChangeOfARecord) {
  using Change = void (*)(FileRecord*);
  const struct {
    Change change;
    const char* part;
  } rows[] = {
      {[](FileRecord* r) { r->recordSize = 695; }, "recordSize of 695"},
      {[](FileRecord* r) { r->fileName[31] = 'x'; }, "fileName does not end"},
      {[](FileRecord* r) { r->destination[259] = 'x'; }, "destination does not end"},
      {[](FileRecord* r) { r->versionLanguage[127] = 'x'; }, "versionLanguage does not end"},
      {[](FileRecord* r) { r->versionLanguage[0] = 'G'; }, "versionLanguage \"G4"},
      {[](FileRecord* r) { r->reserved[0] = 1; }, "reserved"},
      {[](FileRecord* r) { r->fileName[0] = '/'; }, "fileName \"/"},
      {[](FileRecord* r) { std::memset(r->destination, 0, 260); }, "nowhere"},
      {[](FileRecord* r) { r->storedSize = 0xFFFFFFFF; }, "reaches into the header"},
      {[](FileRecord* r) {
         std::strcpy(r->fileName, "a.exe");
         std::strcpy(r->destination, "\\");
         std::memset(r->destination + 1, 0, 259);
       },
       "filled already"},
  };
  for (const auto& row : rows) {
    PackSample();
    ChangeRecord(1, row.change);
    ExpectWrong(row.part);
  }
}

TEST_F(ImageVerifier, ComparesStreamsWithTheirSizes) {
  const std::pair<uint32_t, const char*> rows[] = {{2999, "expands to more than"},
                                                   {3001, "expands to 3000 bytes"},
                                                   {0x80000000, "2 GiB or more"}};
  for (const auto& [size, part] : rows) {
    PackSample();
    ChangeRecord(1, [size](FileRecord* record) { record->fileSize = size; });
    ChangeHeader([size](PackageHeader* header) { header->spaceNeeded += size - 3000; });
    ExpectWrong(part);
  }
}

TEST_F(ImageVerifier, FindsBadStreamsGapsAndMissingPrograms) {
  const struct {
    std::function<void(std::string*)> change;
    std::function<void(PackageHeader*)> adapt;
    const char* part;
  } rows[] = {
      {[this](std::string* image) { (*image)[RecordOffset("image.exe", 1) + 696] = 'p'; },
       [](PackageHeader*) {}, "does not begin with"},
      {[](std::string* image) { image->insert(image->size() - 568, 1, '\0'); },
       [](PackageHeader* header) { ++header->packageLength; }, "1 bytes stand between"},
      {[](std::string* image) { (*image)[0] = 'X'; }, [](PackageHeader*) {}, "no version resource"},
      {[this](std::string* image) { image->erase(0, HeaderOf("image.exe").dataOffset); },
       [](PackageHeader* header) { header->dataOffset = 0; }, "no executable"},
  };
  for (const auto& row : rows) {
    PackSample();
    std::string image = Read("image.exe");
    row.change(&image);
    Write("image.exe", image);
    ChangeHeader(row.adapt);
    ExpectWrong(row.part);
  }
}

TEST_F(ImageVerifier, KnowsTheRulesOfRemovalPrograms) {
  PackSample();
  const ToolRun run =
      RunImage({"removal", "@image.exe", "-o", "@removal.exe", "--language", "german"});
  ASSERT_EQ(run.status, 0) << run.err;
  const PackageHeader header = HeaderOf("removal.exe");
  EXPECT_EQ(Read("removal.exe").size(), header.dataOffset + 3 * 696u + 568u);
  EXPECT_EQ(header.defaultLanguage, 20000);
  EXPECT_STREQ(RecordOf("removal.exe", 1).destination, RecordOf("image.exe", 1).destination);
  EXPECT_TRUE(WrongIn("removal.exe").empty());
  ExpectRefused(RunImage({"removal", "@removal.exe", "-o", "@again.exe"}));

  ChangeHeader([](PackageHeader* image) {
    image->removalImageFlag = 1;
    image->packageLength = 3 * 696;
  });
  EXPECT_EQ(WrongIn("image.exe").size(), 3u);  // each record has a stream
}

// The message catalog as the program sees it: through LoadStringA, in code page 1252.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <map>
#include <set>
#include <string>
#include <utility>

#include "machine/machine.h"
#include "platform/win32.h"

namespace {

constexpr UINT kEnglish = 0;
constexpr UINT kFrench = 10000;
constexpr UINT kGerman = 20000;
constexpr UINT kItalian = 30000;
constexpr UINT kSpanish = 40000;

const std::map<UINT, std::string> kTags = {
    {kEnglish, "_ENG_ "}, {kGerman, "_GER_ "}, {kItalian, "_ITA_ "}, {kSpanish, "_SPA_ "}};

// Names that must not change with the language.
const std::set<UINT> kAtOffsetZeroAlone = {115, 117, 137, 510, 600, 601, 602, 603, 604};
// The default directory and the web address in its two forms.
const std::set<UINT> kWithoutTag = {113, 127, 128};
// Rows of the tagged sets that are not tag and French text, by set and id.
const std::map<std::pair<UINT, UINT>, std::string> kOwnTexts = {
    {{kEnglish, 107}, "Ok"},
    {{kEnglish, 108}, "Cancel"},
    {{kEnglish, 109}, "End"},
    {{kEnglish, 110}, "Install"},
    {{kEnglish, 120}, "Remove"},
    {{kEnglish, 125}, "Update"},
    {{kEnglish, 135}, "Language :"},
    {{kEnglish, 138}, "_ENG_ Etes-vous bien s\xFBr de vouloir abandonner l'op\xE9ration ?"},
    {{kEnglish, 140}, "_ENG_ Space needed :"},
    {{kEnglish, 141}, "_ENG_ Space occupied :"},
    {{kEnglish, 142}, "Mb"},
    {{kGerman, 141},
     "_GER_ Taille occup\xE9"
     "e"},
    {{kGerman, 142}, "Mo"},
    {{kItalian, 141},
     "_ITA_ Taille occup\xE9"
     "e"},
    {{kItalian, 142}, "Mo"},
    {{kSpanish, 141},
     "_SPA_ Taille occup\xE9"
     "e"},
    {{kSpanish, 142}, "Mo"},
};

class Catalog : public testing::Test {
 protected:
  static void SetUpTestSuite() {
    folder_ = std::filesystem::path(testing::TempDir()) / ("catalog_" + std::to_string(getpid()));
    std::string error;
    ASSERT_TRUE(machine::Start(folder_, {}, &error)) << error;
  }

  static void TearDownTestSuite() {
    machine::Stop();
    std::filesystem::remove_all(folder_);
  }

  // Empty for a row that does not exist: the catalog has no empty rows.
  static std::string Load(UINT id) {
    char buffer[2000] = "";
    const int length = LoadStringA(GetModuleHandleA(nullptr), id, buffer, sizeof(buffer));
    return std::string(buffer, static_cast<size_t>(length));
  }

  // The catalog ids that the French set must have: all but the names.
  static std::set<UINT> FrenchIds() {
    std::set<UINT> ids;
    for (UINT id = 100; id <= 142; ++id) ids.insert(id);
    for (UINT id = 1000; id <= 1019; ++id) ids.insert(id);
    ids.erase(112);
    for (const UINT id : kAtOffsetZeroAlone) ids.erase(id);
    return ids;
  }

 private:
  static inline std::filesystem::path folder_;
};

TEST_F(Catalog, EverySetHasItsRowsAndThereAreNoOthers) {
  std::set<UINT> expected = kAtOffsetZeroAlone;
  for (const UINT set : {kEnglish, kFrench, kGerman, kItalian, kSpanish}) {
    for (const UINT id : FrenchIds()) expected.insert(set + id);
  }
  std::set<UINT> found;
  for (UINT id = 0; id <= 0xFFFF; ++id) {
    if (!Load(id).empty()) found.insert(id);
  }
  EXPECT_THAT(found, testing::ContainerEq(expected));
}

TEST_F(Catalog, RowsOfATaggedSetAreTagAndFrenchTextUnlessListed) {
  for (const auto& [set, tag] : kTags) {
    for (const UINT id : FrenchIds()) {
      const auto own = kOwnTexts.find({set, id});
      const std::string french = Load(kFrench + id);
      const std::string expected = own != kOwnTexts.end()     ? own->second
                                   : kWithoutTag.contains(id) ? french
                                                              : tag + french;
      EXPECT_EQ(Load(set + id), expected) << "row " << set + id;
    }
  }
}

TEST_F(Catalog, RowsStandToTheLetter) {
  const std::map<UINT, std::string> rows = {
      {10113, "C:\\Program Files\\Moriv"},
      {128, "http://www.moriv.example/"},
      {137, "MorivLog.txt"},
      {510, "5"},
      {601, "Francais"},
      {604, "Espa\xF1ol"},
  };
  for (const auto& [id, text] : rows) EXPECT_EQ(Load(id), text) << "row " << id;
}

// A longer text would be cut without a word where it is shown.
TEST_F(Catalog, EveryRowFitsTheBufferOfItsReader) {
  const std::set<UINT> names = {142, 600, 601, 602, 603, 604};
  const std::set<UINT> paths = {113, 114, 115, 117, 127, 128, 135, 137};
  for (UINT id = 0; id <= 0xFFFF; ++id) {
    const UINT row = id % 10000;
    const size_t size = names.contains(row) ? 32 : paths.contains(row) ? 260 : 500;
    EXPECT_LT(Load(id).size(), size) << "row " << id;
  }
}

}  // namespace

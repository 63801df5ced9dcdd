// The message catalog as the program sees it: through LoadStringA, in code page 1252.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <map>
#include <set>
#include <string>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

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
// Rows that are not tag and French text: those that English has of its own, and those that all the
// others have, too.
const std::set<UINT> kOwnInEnglish = {107, 108, 109, 110, 120, 125, 135, 138, 140, 141, 142};
const std::set<UINT> kOwnInAll = {141, 142};

class Catalog : public testing::Test {
 protected:
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
  TestMachine pc_;
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

TEST_F(Catalog, RowsOfATaggedSetAreTagAndFrenchTextUnlessTheyAreItsOwn) {
  for (const auto& [set, tag] : kTags) {
    for (const UINT id : FrenchIds()) {
      if ((set == kEnglish ? kOwnInEnglish : kOwnInAll).contains(id)) continue;
      const std::string expected = (kWithoutTag.contains(id) ? "" : tag) + Load(kFrench + id);
      EXPECT_EQ(Load(set + id), expected) << "row " << set + id;
    }
  }
}

TEST_F(Catalog, RowsStandToTheLetter) {
  const std::map<UINT, std::string> rows = {
      {10113, "C:\\Program Files\\Moriv"},
      {108, "Cancel"},
      {128, "http://www.moriv.example/"},
      {137, "MorivLog.txt"},
      {142, "Mb"},
      {20142, "Mo"},
      {30141,
       "_ITA_ Taille occup\xE9"
       "e"},
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

// The message catalog as the program sees it, against catalog.txt.
//
// A line there is a row: its id and its French text; behind it, each in the brackets of its sets,
// the texts that are not the set's tag and the French text; a bar ends it. The file is in UTF-8.
#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <sstream>
#include <string>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

constexpr UINT kFrench = 10000;
constexpr std::pair<UINT, const char*> kOtherSets[] = {
    {0, "ENG"}, {20000, "GER"}, {30000, "ITA"}, {40000, "SPA"}};

// Empty for a row that does not exist: the catalog has no empty rows.
std::string Load(UINT id) {
  char buffer[1000] = "";
  const int length = LoadStringA(GetModuleHandleA(nullptr), id, buffer, sizeof(buffer));
  std::string text;
  for (const char byte : std::string(buffer, static_cast<size_t>(length))) {
    const auto letter = static_cast<unsigned char>(byte);
    if (byte == '\r' || byte == '\n') {
      text += byte == '\r' ? "\\r" : "\\n";
    } else if (letter < 0x80) {
      text += byte;
    } else {  // above 0x9F the same in Unicode; there is none below
      text += {static_cast<char>(0xC0 | letter >> 6), static_cast<char>(0x80 | (letter & 0x3F))};
    }
  }
  return text;
}

std::string DescribeRow(UINT id) {
  const std::string french = Load(kFrench + id);
  std::vector<std::pair<std::string, std::string>> others;  // sets, text
  for (const auto& [offset, name] : kOtherSets) {
    const std::string text = Load(offset + id);
    if (text == (french.empty() ? "" : std::string("_") + name + "_ " + french)) continue;
    if (!others.empty() && others.back().second == text) {
      others.back().first += std::string(" ") + name;
    } else {
      others.emplace_back(name, text);
    }
  }
  if (french.empty() && others.empty()) return "";
  std::string line = std::to_string(id) + (french.empty() ? "" : " " + french);
  for (const auto& [sets, text] : others) line += " [" + sets + "] " + text;
  return line + "|\n";
}

TEST(Catalog, HasItsRowsInEverySetAndNoOthers) {
  const TestMachine pc;
  std::string rows;
  for (UINT id = 0; id < kFrench; ++id) rows += DescribeRow(id);
  for (UINT id = 50000; id <= UINT16_MAX; ++id) EXPECT_EQ(Load(id), "") << id;
  std::ostringstream expected;
  expected << std::ifstream(MORIV_SOURCE_DIR "/tests/resources/catalog.txt").rdbuf();
  EXPECT_EQ(rows, expected.str());
}

}  // namespace

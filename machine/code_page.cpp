#include "machine/code_page.h"

#include <array>
#include <map>
#include <unordered_map>

#include "machine/host_characters.h"

namespace machine {
namespace {

constexpr char32_t kReplacement = 0xFFFD;

// One single-byte code page, as tables. A lead byte of a double-byte page counts as a byte without
// a meaning: Windows goes by pairs there.
struct CodePage {
  std::array<char16_t, 256> unicode;
  std::unordered_map<char32_t, unsigned char> bytes;  // the inverse of `unicode`
  std::array<unsigned char, 256> upper;
};

CodePage MakeCodePage(int number) {
  CodePage page;
  page.unicode = CharactersOf(number);
  for (unsigned byte = 0; byte < 256; ++byte) {
    page.bytes.emplace(page.unicode[byte], static_cast<unsigned char>(byte));
  }
  for (unsigned byte = 0; byte < 256; ++byte) {
    const auto found = page.bytes.find(ToUpperCharacter(page.unicode[byte]));
    page.upper[byte] = found != page.bytes.end() ? found->second : static_cast<unsigned char>(byte);
  }
  return page;
}

int currentNumber = kUsualCodePage;

const CodePage& CurrentCodePage() {
  static std::map<int, CodePage> pages;
  auto found = pages.find(currentNumber);
  if (found == pages.end()) found = pages.emplace(currentNumber, MakeCodePage(currentNumber)).first;
  return found->second;
}

void AppendUtf8(char32_t character, std::string* text) {
  const auto tail = [&](int shift) {
    text->push_back(static_cast<char>(0x80 | ((character >> shift) & 0x3F)));
  };
  if (character < 0x80) {
    text->push_back(static_cast<char>(character));
  } else if (character < 0x800) {
    text->push_back(static_cast<char>(0xC0 | (character >> 6)));
    tail(0);
  } else {
    text->push_back(static_cast<char>(0xE0 | (character >> 12)));
    tail(6);
    tail(0);
  }
}

// Takes one character off the front of `utf8`, which is not empty. A byte that begins no
// well-formed sequence is a replacement character of its own.
char32_t TakeCharacter(std::string_view* utf8) {
  const auto byteAt = [&](size_t at) { return static_cast<unsigned char>((*utf8)[at]); };
  const unsigned char first = byteAt(0);
  const size_t length = first < 0x80                    ? 1
                        : first >= 0xC2 && first < 0xE0 ? 2
                        : first >= 0xE0 && first < 0xF0 ? 3
                        : first >= 0xF0 && first < 0xF5 ? 4
                                                        : 0;
  char32_t character = length == 1 ? first : first & (0x7Fu >> length);
  bool wellFormed = length != 0 && length <= utf8->size();
  for (size_t at = 1; wellFormed && at < length; ++at) {
    wellFormed = (byteAt(at) & 0xC0) == 0x80;
    character = character << 6 | (byteAt(at) & 0x3F);
  }
  utf8->remove_prefix(wellFormed ? length : 1);
  return wellFormed ? character : kReplacement;
}

char ByteOf(const CodePage& page, char32_t character) {
  if (character < 0x80) return static_cast<char>(character);  // the same in every page
  const auto found = page.bytes.find(character);
  return found != page.bytes.end() ? static_cast<char>(found->second) : '?';
}

// Windows takes the plain letter for an accented one that a European page lacks: of U+00C0 to
// U+00FF. The Hebrew and the Baltic page have none of that.
char LetterOf(const CodePage& page, char16_t character) {
  constexpr std::string_view kLetters =
      "AAAAAA?CEEEEIIII?NOOOOO?OUUUUY??aaaaaa?ceeeeiiii?nooooo?ouuuuy?y";
  constexpr char16_t kFirst = 0xC0;
  constexpr int kLastEuropeanPage = 1254;
  const bool hasLetter = character >= kFirst && character - kFirst < 0x40;
  const bool isMissing = !page.bytes.contains(character);
  if (isMissing && hasLetter && currentNumber <= kLastEuropeanPage) {
    return kLetters[character - kFirst];
  }
  return ByteOf(page, character);
}

}  // namespace

void UseCodePage(int number) {
  currentNumber = number;
}

std::string ToUtf8(std::string_view ansi) {
  const CodePage& page = CurrentCodePage();
  std::string utf8;
  for (const char byte : ansi) AppendUtf8(page.unicode[static_cast<unsigned char>(byte)], &utf8);
  return utf8;
}

std::string FromUtf8(std::string_view utf8) {
  const CodePage& page = CurrentCodePage();
  std::string ansi;
  while (!utf8.empty()) ansi.push_back(ByteOf(page, TakeCharacter(&utf8)));
  return ansi;
}

std::string FromUtf16(std::u16string_view text) {
  const CodePage& page = CurrentCodePage();
  std::string ansi;
  for (const char16_t unit : text) ansi.push_back(LetterOf(page, unit));
  return ansi;
}

std::u16string ToUtf16(std::string_view ansi) {
  const CodePage& page = CurrentCodePage();
  std::u16string text;
  for (const char byte : ansi) text.push_back(page.unicode[static_cast<unsigned char>(byte)]);
  return text;
}

unsigned char ToUpperByte(unsigned char byte) {
  return CurrentCodePage().upper[byte];
}

bool EqualNoCase(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  const CodePage& page = CurrentCodePage();
  for (size_t at = 0; at < a.size(); ++at) {
    if (page.upper[static_cast<unsigned char>(a[at])] !=
        page.upper[static_cast<unsigned char>(b[at])]) {
      return false;
    }
  }
  return true;
}

}  // namespace machine

#include "tools/terminal/printable_text.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <iterator>

namespace terminal {
namespace {

struct Range {
  uint32_t first, last;
};
constexpr Range kHidden[] = {
    {0x00, 0x1F},        // C0
    {0x7F, 0x9F},        // DEL and C1
    {0x061C, 0x061C},    // Arabic letter mark
    {0x180E, 0x180E},    // Mongolian vowel separator
    {0x200B, 0x200F},    // of no width; left-to-right and right-to-left mark
    {0x2028, 0x202E},    // separators of lines and paragraphs; embeddings and overrides
    {0x2060, 0x206F},    // word joiner and its like; isolates
    {0xFEFF, 0xFEFF},    // byte order mark
    {0xFFF9, 0xFFFB},    // interlinear annotation
    {0xE0000, 0xE007F},  // tags
};

bool IsHidden(uint32_t character) {
  return std::any_of(std::begin(kHidden), std::end(kHidden), [character](const Range& range) {
    return character >= range.first && character <= range.last;
  });
}

// The character that the text begins with and its bytes; `size` 0 when these are no UTF-8.
struct Character {
  uint32_t value = 0;
  size_t size = 0;
};

Character FirstCharacter(std::string_view text) {
  const auto lead = static_cast<uint8_t>(text[0]);
  if (lead < 0x80) return {lead, 1};
  const size_t size = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : 2;
  if (lead < 0xC2 || lead > 0xF4 || text.size() < size) return {};
  uint32_t value = lead & (0x7Fu >> size);
  for (size_t i = 1; i < size; ++i) {
    const auto byte = static_cast<uint8_t>(text[i]);
    if ((byte & 0xC0) != 0x80) return {};
    value = value << 6 | (byte & 0x3F);
  }
  constexpr uint32_t kSmallest[] = {0, 0, 0x80, 0x800, 0x10000};
  const bool isSurrogate = value >= 0xD800 && value <= 0xDFFF;
  if (value < kSmallest[size] || value > 0x10FFFF || isSurrogate) return {};
  return {value, size};
}

void AppendEscaped(const char* prefix, int digits, uint32_t value, std::string* text) {
  char escaped[16];
  std::snprintf(escaped, sizeof escaped, "%s%0*x", prefix, digits, static_cast<unsigned>(value));
  *text += escaped;
}

void AppendHidden(uint32_t character, std::string* text) {
  if (character > 0xFFFF) {  // as two halves, UTF-16's
    AppendEscaped("\\u", 4, 0xD800 + ((character - 0x10000) >> 10), text);
    character = 0xDC00 + ((character - 0x10000) & 0x3FF);
  }
  AppendEscaped("\\u", 4, character, text);
}

}  // namespace

std::string Printable(std::string_view utf8) {
  std::string shown;
  while (!utf8.empty()) {
    const Character character = FirstCharacter(utf8);
    const size_t size = std::max<size_t>(character.size, 1);
    if (character.size == 0) {
      AppendEscaped("\\x", 2, static_cast<uint8_t>(utf8[0]), &shown);
    } else if (IsHidden(character.value)) {
      AppendHidden(character.value, &shown);
    } else {
      shown += utf8.substr(0, size);
    }
    utf8.remove_prefix(size);
  }
  return shown;
}

std::string Quoted(std::string_view utf8) {
  return '"' + Printable(utf8) + '"';
}

std::string PrintableLines(std::string_view utf8) {
  std::string shown;
  for (;;) {
    const size_t end = utf8.find('\n');
    shown += Printable(utf8.substr(0, end));
    if (end == std::string_view::npos) return shown;
    shown += '\n';
    utf8.remove_prefix(end + 1);
  }
}

}  // namespace terminal

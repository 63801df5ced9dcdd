#include "tools/image/record_text.h"

#include <cstdio>

#include "machine/code_page.h"

namespace image {

std::string Shown(std::string_view ansi) {
  std::string shown = "\"";
  for (const char c : ansi) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte < 0x20 || byte == 0x7F) {
      char escaped[8];
      std::snprintf(escaped, sizeof escaped, "\\x%02x", byte);
      shown += escaped;
    } else {
      shown += machine::ToUtf8(std::string_view(&c, 1));
    }
  }
  return shown + '"';
}

std::string ToUpper(std::string_view ansi) {
  std::string upper(ansi);
  for (char& c : upper) {
    c = static_cast<char>(machine::ToUpperByte(static_cast<unsigned char>(c)));
  }
  return upper;
}

bool ConvertToAnsi(std::string_view utf8, std::string* ansi) {
  *ansi = machine::FromUtf8(utf8);
  return machine::ToUtf8(*ansi) == utf8;
}

}  // namespace image

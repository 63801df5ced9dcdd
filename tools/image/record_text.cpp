#include "tools/image/record_text.h"

#include "machine/code_page.h"
#include "tools/terminal/printable_text.h"

namespace image {

std::string Shown(std::string_view ansi) {
  std::string shown = "\"";
  shown += terminal::Printable(machine::ToUtf8(ansi));
  return shown += '"';
}

std::string Utf8Text(std::span<const char> field) {
  return machine::ToUtf8(FieldText(field));
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

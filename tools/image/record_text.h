// Texts of a package's records: fixed fields of code page bytes, ended by a NUL and filled with
// zeros, as a package should have them and as a damaged one may not.
#pragma once

#include <algorithm>
#include <cstring>
#include <span>
#include <string>
#include <string_view>

namespace image {

// The text of a field, up to its NUL or, without one, its whole width.
inline std::string FieldText(std::span<const char> field) {
  return {field.begin(), std::find(field.begin(), field.end(), '\0')};
}

// Whether the field has a NUL and nothing but zeros behind it.
inline bool IsFieldFilled(std::span<const char> field) {
  const auto end = std::find(field.begin(), field.end(), '\0');
  return end != field.end() && std::all_of(end, field.end(), [](char c) { return c == '\0'; });
}

// False, with the field unchanged, for a text that leaves no room for a NUL.
inline bool SetFieldText(std::span<char> field, std::string_view text) {
  if (text.size() >= field.size()) return false;
  std::fill(field.begin(), field.end(), '\0');
  std::copy(text.begin(), text.end(), field.begin());
  return true;
}

// A text of the package for people: quoted, in UTF-8, printable.
std::string Shown(std::string_view ansi);

// The same as it stands, in UTF-8: for JSON, which escapes for itself.
std::string Utf8Text(std::span<const char> field);

// For comparisons without regard to case.
std::string ToUpper(std::string_view ansi);

// Code page bytes of a UTF-8 text. False for a character that the code page lacks.
bool ConvertToAnsi(std::string_view utf8, std::string* ansi);

}  // namespace image

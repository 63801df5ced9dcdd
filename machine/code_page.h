// Conversions between the ANSI code page, UTF-8 (host file names, terminal) and UTF-16
// (resources). A byte without a meaning in the code page becomes the C1 control of its value and
// comes back as the same byte, as on Windows; a character that the code page lacks becomes '?'.
#pragma once

#include <string>
#include <string_view>

namespace machine {

inline constexpr int kUsualCodePage = 1252;

// All of the functions below go by this code page from now on; until then by the usual one.
void UseCodePage(int number);

std::string ToUtf8(std::string_view ansi);
std::string FromUtf8(std::string_view utf8);
std::string FromUtf16(std::u16string_view text);
std::u16string ToUtf16(std::string_view ansi);

// Upper case of one code page byte, for comparisons without regard to case.
unsigned char ToUpperByte(unsigned char byte);
bool EqualNoCase(std::string_view a, std::string_view b);

}  // namespace machine

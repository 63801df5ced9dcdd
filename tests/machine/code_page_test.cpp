// Conversions between code page, UTF-8 and UTF-16.
#include "machine/code_page.h"

#include <gtest/gtest.h>

namespace {

using machine::EqualNoCase;
using machine::FromUtf8;
using machine::ToUtf8;

TEST(CodePage, EveryByteComesBack) {
  std::string bytes;
  for (int byte = 0; byte < 256; ++byte) bytes += static_cast<char>(byte);
  // The last is the usual one; 0xE9 in each.
  const std::pair<int, const char*> pages[] = {{1251, "\xD0\xB9"},
                                               {850, "\xC3\x9A"},
                                               {874, "\xE0\xB9\x89"},
                                               {99999, "\xC3\xA9"},
                                               {1252, "\xC3\xA9"}};
  for (const auto& [number, text] : pages) {
    machine::UseCodePage(number);
    EXPECT_EQ(FromUtf8(ToUtf8(bytes)), bytes) << number;
    EXPECT_EQ(machine::FromUtf16(machine::ToUtf16(bytes)), bytes) << number;
    EXPECT_EQ(ToUtf8("\xE9"), text) << number;
  }
}

TEST(CodePage, WhatHasNoByteOfThePageIsAQuestionMark) {
  const std::pair<const char*, const char*> rows[] = {
      {"\xC3\xA9\xE2\x82\xAC", "\xE9\x80"},  // e with acute, euro sign
      {"a\xD0\xB9z", "a?z"},
      {"\xC2\x80", "?"},          // the control of a byte that means something else
      {"\xF0\x9F\x98\x80", "?"},  // above the 16-bit plane
      {"\xC3", "?"},              // ill-formed: one mark a byte
      {"\xA9x", "?x"},
      {"\xE2\x82", "??"},
      {"\xC0\xAF", "??"},
      {"\xFF", "?"},
  };
  for (const auto& [text, bytes] : rows) EXPECT_EQ(FromUtf8(text), bytes) << text;
  EXPECT_EQ(machine::FromUtf16(u"\u0439"), "?");
  EXPECT_EQ(machine::ToUtf16("\x81"), u"\x81");  // a byte without a meaning
}

TEST(CodePage, CaseFollowsThePage) {
  EXPECT_TRUE(EqualNoCase("D\xE9j\xE0 vu", "D\xC9J\xC0 VU"));
  EXPECT_FALSE(EqualNoCase("\xE9", "e") || EqualNoCase("a", "ab") || EqualNoCase("[", "{"));
  EXPECT_EQ(machine::ToUpperByte(0xFF), 0x9F);  // y with diaeresis lies apart from its capital
  EXPECT_EQ(machine::ToUpperByte(0xDF), 0xDF);  // sharp s has none
}

}  // namespace

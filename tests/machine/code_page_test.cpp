// Conversions between code page, UTF-8 and UTF-16.
#include "machine/code_page.h"

#include <gtest/gtest.h>

#include "machine/machine.h"

namespace {

using machine::EqualNoCase;
using machine::FromUtf16;
using machine::FromUtf8;
using machine::ToUtf16;
using machine::ToUtf8;

class CodePage : public testing::Test {
 protected:
  void TearDown() override { machine::CurrentSettings().codePage = 1252; }
};

TEST_F(CodePage, EveryByteComesBack) {
  for (const int number : {1252, 1251, 850, 874, 99999}) {
    machine::CurrentSettings().codePage = number;
    std::string bytes;
    for (int byte = 0; byte < 256; ++byte) bytes += static_cast<char>(byte);
    EXPECT_EQ(FromUtf8(ToUtf8(bytes)), bytes) << number;
    EXPECT_EQ(FromUtf16(ToUtf16(bytes)), bytes) << number;
  }
}

TEST_F(CodePage, CharactersAreThoseOfThePage) {
  EXPECT_EQ(ToUtf8("\xE9\x80"), "\xC3\xA9\xE2\x82\xAC");  // e with acute, euro sign
  EXPECT_EQ(ToUtf16("\x81"), u"\x81");                    // a byte without a meaning
  machine::CurrentSettings().codePage = 1251;
  EXPECT_EQ(ToUtf8("\xE9"), "\xD0\xB9");
}

TEST_F(CodePage, WhatHasNoByteOfThePageIsAQuestionMark) {
  const std::pair<const char*, const char*> rows[] = {
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
  EXPECT_EQ(FromUtf16(u"\u0439"), "?");
}

TEST_F(CodePage, CaseFollowsThePage) {
  EXPECT_TRUE(EqualNoCase("D\xE9j\xE0 vu", "D\xC9J\xC0 VU"));
  EXPECT_FALSE(EqualNoCase("\xE9", "e"));
  EXPECT_FALSE(EqualNoCase("a", "ab"));
  EXPECT_FALSE(EqualNoCase("[", "{"));
  EXPECT_EQ(machine::ToUpperByte(0xFF), 0x9F);  // y with diaeresis lies apart from its capital
  EXPECT_EQ(machine::ToUpperByte(0xDF), 0xDF);  // sharp s has none
}

}  // namespace

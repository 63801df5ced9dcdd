// Dialog templates, good and damaged.
#include "machine/dialog_template.h"

#include <gtest/gtest.h>

#include "machine/executable_resources.h"

namespace {

// The program's own, which holds every form: class by number, text, picture by number, font.
std::vector<uint8_t> OwnTemplate() {
  return machine::OwnResource(5, 116).value_or(std::vector<uint8_t>());
}

TEST(DialogTemplate, CutAnywhereIsNone) {
  const std::vector<uint8_t> whole = OwnTemplate();
  ASSERT_TRUE(machine::ReadDialogTemplate(whole));
  // The last two bytes may be the filling that follows the last control.
  for (size_t size = 0; size + 4 < whole.size(); ++size) {
    EXPECT_FALSE(machine::ReadDialogTemplate(std::span(whole).first(size))) << size;
  }
}

TEST(DialogTemplate, CountBeyondTheControlsIsNone) {
  std::vector<uint8_t> bytes = OwnTemplate();
  constexpr size_t kCountOffset = 8;
  bytes[kCountOffset] = 0xFF;
  bytes[kCountOffset + 1] = 0xFF;
  EXPECT_FALSE(machine::ReadDialogTemplate(bytes));
}

TEST(DialogTemplate, ExtendedFormIsNotTaken) {
  std::vector<uint8_t> bytes = OwnTemplate();
  const uint8_t mark[] = {0x01, 0x00, 0xFF, 0xFF};
  std::copy(std::begin(mark), std::end(mark), bytes.begin());
  EXPECT_FALSE(machine::ReadDialogTemplate(bytes));
}

TEST(DialogTemplate, ClassesAndTextsComeByNameToo) {
  const auto text = [](std::vector<uint8_t>* bytes, std::u16string_view units) {
    for (const char16_t unit : units) {
      bytes->push_back(static_cast<uint8_t>(unit & 0xFF));
      bytes->push_back(static_cast<uint8_t>(unit >> 8));
    }
    bytes->insert(bytes->end(), 2, 0);
  };
  std::vector<uint8_t> bytes = {0, 0, 0, 0x10, 0, 0, 0, 0, 1, 0};  // style, extended style, count
  bytes.insert(bytes.end(), 8, 0);                                 // rectangle
  text(&bytes, u"MENU");
  text(&bytes, u"CLASS");
  text(&bytes, u"T\u00E9");
  while (bytes.size() % 4 != 0) bytes.push_back(0xCC);
  for (const int byte : {0, 0, 1, 0x50, 0, 0, 0, 0, 0xFE, 0xFF, 2, 0, 3, 0, 4, 0, 7, 0}) {
    bytes.push_back(static_cast<uint8_t>(byte));
  }
  text(&bytes, u"Edit");
  text(&bytes, u"inside");
  bytes.insert(bytes.end(), 2, 0);  // no creation data

  const auto dialog = machine::ReadDialogTemplate(bytes);
  ASSERT_TRUE(dialog);
  EXPECT_EQ(dialog->frame.className, "CLASS");
  EXPECT_EQ(dialog->frame.text, "T\xE9");
  ASSERT_EQ(dialog->controls.size(), 1u);
  EXPECT_EQ(dialog->controls[0].className, "Edit");
  EXPECT_EQ(dialog->controls[0].text, "inside");
  EXPECT_EQ(dialog->controls[0].x, -2);
  EXPECT_EQ(dialog->controls[0].height, 4);
  EXPECT_EQ(dialog->controls[0].id, 7);
}

}  // namespace

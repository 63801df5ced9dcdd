// Dialog templates, good and damaged.
#include "machine/dialog_template.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <utility>

#include "machine/executable_resources.h"
#include "tests/support/executable_builder.h"

namespace {

// The program's own, which holds every form: class by number, text, picture by number, font.
std::vector<uint8_t> OwnTemplate() {
  return machine::OwnResource(5, 116).value_or(std::vector<uint8_t>());
}

TEST(DialogTemplate, DamagedOneIsNone) {
  const std::vector<uint8_t> whole = OwnTemplate();
  ASSERT_TRUE(machine::ReadDialogTemplate(whole));
  // The last two bytes may be the filling that follows the last control.
  for (size_t size = 0; size + 4 < whole.size(); ++size) {
    EXPECT_FALSE(machine::ReadDialogTemplate(std::span(whole).first(size))) << size;
  }
  const std::vector<uint8_t> mark = {0x01, 0x00, 0xFF, 0xFF};  // of the extended form, not taken
  const std::vector<uint8_t> count = {0xFF, 0xFF};             // beyond the controls
  for (const auto& [offset, bytes] : {std::pair{0, mark}, {8, count}}) {
    std::vector<uint8_t> damaged = whole;
    std::ranges::copy(bytes, damaged.begin() + offset);
    EXPECT_FALSE(machine::ReadDialogTemplate(damaged)) << offset;
  }
}

TEST(DialogTemplate, ClassesAndTextsComeByNameToo) {
  ByteBuilder bytes;
  bytes.U32(0x10000000).U32(0).U16(1).PadTo(18);  // style, extended style, count, rectangle
  bytes.Wide("MENU").U16(0).Wide("CLASS").U16(0).Wide("T\xE9").U16(0).Align();
  bytes.U32(0x50010000).U32(0).U16(0xFFFE).U16(2).U16(3).U16(4).U16(7);
  bytes.Wide("Edit").U16(0).Wide("inside").U16(0).U16(0);  // no creation data
  const auto* const first = reinterpret_cast<const uint8_t*>(bytes.bytes().data());

  const auto dialog = machine::ReadDialogTemplate({first, bytes.bytes().size()});
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

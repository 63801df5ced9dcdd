#include "machine/dialog_template.h"

#include "machine/bounded_bytes.h"
#include "machine/code_page.h"

namespace machine {
namespace {

constexpr uint16_t kOrdinalMark = 0xFFFF;       // a number stands in place of a text
constexpr uint32_t kHasFont = 0x40;             // DS_SETFONT
constexpr uint32_t kExtendedForm = 0xFFFF0001;  // in place of the style

// The system's own classes have numbers.
std::string ClassName(uint16_t number) {
  switch (number) {
    case 0x80:
      return "Button";
    case 0x81:
      return "Edit";
    case 0x82:
      return "Static";
    case 0x85:
      return "ComboBox";
    default:
      return "";
  }
}

struct NameOrNumber {
  std::string name;
  uint16_t number = 0;  // when there is no name
};

class TemplateReader {
 public:
  explicit TemplateReader(std::span<const uint8_t> bytes) : bytes_(bytes) {}

  uint16_t U16() {
    const uint16_t value = bytes_.U16(position_);
    position_ += 2;
    return value;
  }

  uint32_t U32() {
    const uint32_t low = U16();
    return low | uint32_t{U16()} << 16;
  }

  std::string Text() {
    std::u16string text;
    for (uint16_t unit = U16(); unit != 0 && good(); unit = U16())
      text += static_cast<char16_t>(unit);
    return FromUtf16(text);
  }

  NameOrNumber TextOrNumber() {
    if (bytes_.U16(position_) != kOrdinalMark) return {Text(), 0};
    position_ += 2;
    return {"", U16()};
  }

  void Skip(size_t count) { position_ += count; }
  void Align() { position_ = (position_ + 3) & ~uint64_t{3}; }
  bool good() const { return bytes_.good(); }

 private:
  BoundedBytes bytes_;
  uint64_t position_ = 0;
};

void ReadRectangle(TemplateReader& reader, TemplateItem* item) {
  item->x = static_cast<int16_t>(reader.U16());
  item->y = static_cast<int16_t>(reader.U16());
  item->width = static_cast<int16_t>(reader.U16());
  item->height = static_cast<int16_t>(reader.U16());
}

TemplateItem ReadControl(TemplateReader& reader) {
  TemplateItem control;
  reader.Align();
  control.style = reader.U32();
  control.extendedStyle = reader.U32();
  ReadRectangle(reader, &control);
  control.id = reader.U16();
  const NameOrNumber className = reader.TextOrNumber();
  control.className = className.name.empty() ? ClassName(className.number) : className.name;
  const NameOrNumber text = reader.TextOrNumber();
  control.text = text.name;
  control.pictureId = text.number;
  reader.Skip(reader.U16());  // creation data, which no control here has
  return control;
}

}  // namespace

std::optional<DialogTemplate> ReadDialogTemplate(std::span<const uint8_t> bytes) {
  TemplateReader reader(bytes);
  DialogTemplate dialog;
  dialog.frame.style = reader.U32();
  if (dialog.frame.style == kExtendedForm) return std::nullopt;
  dialog.frame.extendedStyle = reader.U32();
  const int count = reader.U16();
  ReadRectangle(reader, &dialog.frame);
  reader.TextOrNumber();  // menu
  dialog.frame.className = reader.TextOrNumber().name;
  dialog.frame.text = reader.Text();
  if ((dialog.frame.style & kHasFont) != 0) {
    dialog.fontSize = reader.U16();
    dialog.fontName = reader.Text();
  }
  for (int index = 0; index < count && reader.good(); ++index) {
    dialog.controls.push_back(ReadControl(reader));
  }
  if (!reader.good()) return std::nullopt;
  return dialog;
}

}  // namespace machine

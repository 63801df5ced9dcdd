// A dialog as the resource compiler wrote it.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace machine {

// A control, or the dialog itself.
struct TemplateItem {
  uint32_t style = 0;
  uint32_t extendedStyle = 0;
  int16_t x = 0;  // dialog units, as the three below
  int16_t y = 0;
  int16_t width = 0;
  int16_t height = 0;
  uint16_t id = 0;         // of a control
  std::string className;   // "Static", "Edit", "Button", "ComboBox"; "" for the dialog's own
  std::string text;        // in the code page
  uint16_t pictureId = 0;  // of a control whose text is a resource's number
};

struct DialogTemplate {
  TemplateItem frame;
  uint16_t fontSize = 0;
  std::string fontName;
  std::vector<TemplateItem> controls;  // in tab order
};

// Reads a template of the old form (DLGTEMPLATE). nullopt when it is damaged or of the extended
// form.
std::optional<DialogTemplate> ReadDialogTemplate(std::span<const uint8_t> bytes);

}  // namespace machine

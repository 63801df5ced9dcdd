#include "machine/dialog_keys.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "machine/code_page.h"
#include "machine/windows.h"

namespace machine {
namespace {

bool IsText(std::string_view key) {
  return key.size() > 2 && key.front() == '"' && key.back() == '"';
}

Window* Focused() {
  return FindWindowByHandle(OpenDialog()->focus);
}

bool MoveFocus(bool isBackwards) {
  Dialog& dialog = *OpenDialog();
  std::vector<Window*> stops = dialog.TabStops();
  if (stops.empty()) return false;
  if (isBackwards) std::ranges::reverse(stops);
  const auto current = std::ranges::find(stops, Focused());
  const bool isLast = current == stops.end() || current + 1 == stops.end();
  Window* const next = isLast ? stops.front() : *(current + 1);
  dialog.focus = next->handle;
  next->selectionStart = 0;
  next->selectionEnd = next->text.size();
  GiveDefaultLook(next->kind == WindowKind::kButton ? next : dialog.Find(dialog.defaultId));
  return true;
}

bool PressDefaultButton() {
  const Window* const focused = Focused();
  if (focused != nullptr && focused->IsDefaultButton()) {
    SendCommand(focused->id, 0, focused->handle);
    return true;
  }
  const LRESULT told = HandleForDialog(kGetDefaultId, 0);
  const int id = told != 0 ? LOWORD(told) : IDOK;
  const Window* const control = OpenDialog()->Find(id);
  if (control == nullptr || control->IsEnabled()) {
    SendCommand(id, 0, control != nullptr ? control->handle : nullptr);
  }
  return true;
}

bool PressFocusedButton() {
  const Window* const focused = Focused();
  if (focused == nullptr || focused->kind != WindowKind::kButton) return false;
  Click(focused->handle);
  return true;
}

bool TypeCharacters(const std::string& text) {
  for (const char character : text) {
    Window* const edit = Focused();
    if (edit == nullptr || edit->kind != WindowKind::kEdit) return false;
    const size_t at = edit->selectionStart;
    std::string changed = edit->text;
    changed.replace(at, edit->selectionEnd - at, 1, character);
    TypeText(edit, changed, at + 1);
  }
  return true;
}

}  // namespace

bool IsKey(const std::string& key) {
  return key == "TAB" || key == "SHIFT+TAB" || key == "ENTER" || key == "SPACE" || IsText(key);
}

bool PressKey(const std::string& key) {
  if (IsText(key)) return TypeCharacters(FromUtf8(key.substr(1, key.size() - 2)));
  if (key == "ENTER") return PressDefaultButton();
  if (key == "SPACE") return PressFocusedButton();
  return MoveFocus(key == "SHIFT+TAB");
}

}  // namespace machine

#include "machine/shown_dialog.h"

#include <string>

#include "machine/drawing.h"
#include "machine/owner_drawing.h"
#include "machine/scripted_user.h"
#include "machine/windows.h"

namespace machine {
namespace {

std::string Shown(const Window& control) {
  std::string line = std::to_string(control.id) + " " + control.className + " " +
                     (control.IsShown() ? "shown " : "hidden ") +
                     (control.IsEnabled() ? "enabled " : "disabled ");
  if (control.kind != WindowKind::kComboBox) {
    return line + Quoted(control.hasPicture ? "" : control.text);
  }
  if (control.selection < 0) return line + "none";
  return line + "selected " + std::to_string(control.selection) + " of " +
         std::to_string(control.items.size());
}

std::string IdOrNone(const Window* window) {
  return window != nullptr ? std::to_string(window->id) : "none";
}

const Window* DefaultButton(const Dialog& dialog) {
  for (const auto& control : dialog.controls) {
    if (control->IsDefaultButton() && control->IsShown()) return control.get();
  }
  return nullptr;
}

std::string Calls(const Drawing& drawing) {
  std::string calls;
  for (const std::string& call : drawing.calls) calls += (calls.empty() ? "" : ", ") + call;
  return calls.empty() ? "nothing" : calls;
}

// What can be told of the pixels alone.
std::string Seen(const Window& control) {
  const Drawing& drawing = control.drawing;
  std::string seen = drawing.colors.empty() ? "nothing" : drawing.colors;
  if (drawing.picture != 0) seen += " picture " + std::to_string(drawing.picture);
  if (control.itemHeight != 0) seen += " height " + std::to_string(control.itemHeight);
  return seen;
}

}  // namespace

void ShowFocus() {
  const Dialog& dialog = *OpenDialog();
  TellUser("dialog " + Quoted(dialog.frame.text) + " focus " +
           IdOrNone(FindWindowByHandle(dialog.focus)) + " default " +
           IdOrNone(DefaultButton(dialog)));
}

void ShowDialog(int id) {
  const Dialog& dialog = *OpenDialog();
  if (id != 0) {
    const Window* const control = dialog.Find(id);
    TellUser(control != nullptr ? Shown(*control) : std::to_string(id) + " absent");
    return;
  }
  ShowFocus();
  for (const auto& control : dialog.controls) TellUser(Shown(*control));
}

void ShowDrawn() {
  for (const auto& control : OpenDialog()->controls) {
    const std::string id = std::to_string(control->id) + " ";
    if (control->font != nullptr) TellUser("font " + id + DescribeFont(control->font));
    if (!control->IsShown() || !control->IsOwnerDrawn()) continue;
    TellUser("drawn " + id + Calls(control->drawing));
    int number = 0;
    for (const Drawing& entry : DrawEntries(*control)) {
      TellUser("drawn " + id + "entry " + std::to_string(number++) + " " + Calls(entry));
    }
    TellUser("seen " + id + Seen(*control));
  }
}

}  // namespace machine

#include "machine/windows.h"

#include <algorithm>
#include <deque>
#include <optional>
#include <utility>

#include "machine/code_page.h"
#include "machine/owner_drawing.h"
#include "machine/scripted_user.h"

namespace machine {
namespace {

constexpr uint32_t kStaticBitmap = 0xE;     // SS_BITMAP
constexpr uint32_t kStaticNotify = 0x100;   // SS_NOTIFY
constexpr uint32_t kListOwnerDrawn = 0x10;  // CBS_OWNERDRAWFIXED
constexpr uint32_t kTabStop = 0x10000;      // WS_TABSTOP
constexpr int kEditUpdate = 0x400;
constexpr int kEditChange = 0x300;

constexpr UINT kSetDefaultId = 0x401;        // DM_SETDEFID
constexpr LRESULT kHasDefault = 0x534B0000;  // DC_HASDEFID, the answer's upper half

// Stands in the queue for the mouse's messages of one click.
constexpr UINT kClickMessage = 0x201;  // WM_LBUTTONDOWN

std::unique_ptr<Dialog> openDialog;
std::deque<MSG> queue;
uintptr_t lastWindowHandle = 0x10000;

HWND NewHandle() {
  return reinterpret_cast<HWND>(lastWindowHandle += 2);
}

std::optional<WindowKind> KindOfClass(const std::string& className) {
  constexpr std::pair<const char*, WindowKind> kKinds[] = {{"Static", WindowKind::kStatic},
                                                           {"Edit", WindowKind::kEdit},
                                                           {"Button", WindowKind::kButton},
                                                           {"ComboBox", WindowKind::kComboBox}};
  for (const auto& [name, kind] : kKinds) {
    if (EqualNoCase(className, name)) return kind;
  }
  return std::nullopt;
}

// Dialog units are fractions of a character of the dialog's font: a quarter of its width, an eighth
// of its height. "MS Sans Serif" of 8 points has 6 by 13 pixels; here every font has.
constexpr LONG PixelsAcross(int units) {
  return units * 6 / 4;
}

constexpr LONG PixelsDown(int units) {
  return units * 13 / 8;
}

std::unique_ptr<Window> MakeControl(const TemplateItem& item, WindowKind kind) {
  auto control = std::make_unique<Window>();
  control->handle = NewHandle();
  control->className = item.className;
  control->kind = kind;
  control->id = item.id;
  control->style = item.style;
  control->text = item.text;
  control->width = PixelsAcross(item.width);
  control->height = PixelsDown(item.height);
  control->hasPicture = control->kind == WindowKind::kStatic &&
                        (item.style & kStaticTypeMask) == kStaticBitmap && item.pictureId != 0;
  control->needsDrawing = true;
  return control;
}

HWND CancelControl() {
  const Window* const control = openDialog->Find(IDCANCEL);
  return control != nullptr ? control->handle : nullptr;
}

// A control of that id that is disabled makes Windows ignore the key and the box.
bool CanCancel() {
  const Window* const control = openDialog->Find(IDCANCEL);
  return control == nullptr || control->IsEnabled();
}

void DestroyDialog() {
  // The lists tell of their entries while the dialog still stands.
  for (const auto& control : openDialog->controls) DeleteItems(*control);
  openDialog.reset();
  queue.clear();
}

bool MakeControls(const std::vector<TemplateItem>& items) {
  for (const TemplateItem& item : items) {
    const std::optional<WindowKind> kind = KindOfClass(item.className);
    if (!kind) return false;
    openDialog->controls.push_back(MakeControl(item, *kind));
    MeasureItems(openDialog->controls.back().get());
  }
  return true;
}

// The dialog's answer tells whether the system is to set the focus. It also does when the program
// did not: the dialog gets it when it is shown.
void InitDialog(LPARAM data) {
  const HWND first = openDialog->FirstTabStop();
  if (SendToDialog(WM_INITDIALOG, reinterpret_cast<WPARAM>(first), data) != FALSE) {
    openDialog->focus = first;
  } else if (openDialog->focus == nullptr) {
    openDialog->focus = openDialog->FirstTabStop();
  }
}

}  // namespace

bool Window::IsOwnerDrawn() const {
  if (kind == WindowKind::kStatic) return (style & kStaticTypeMask) == SS_OWNERDRAW;
  return kind == WindowKind::kComboBox && (style & kListOwnerDrawn) != 0;
}

bool Window::IsDefaultButton() const {
  return kind == WindowKind::kButton && (style & kButtonTypeMask) == BS_DEFPUSHBUTTON;
}

Window* Dialog::Find(int id) const {
  const auto found = std::ranges::find_if(
      controls, [id](const std::unique_ptr<Window>& control) { return control->id == id; });
  return found != controls.end() ? found->get() : nullptr;
}

Window* Dialog::FindDefaultButton() const {
  const auto found = std::ranges::find_if(
      controls, [](const auto& control) { return control->IsDefaultButton(); });
  return found != controls.end() ? found->get() : nullptr;
}

std::vector<Window*> Dialog::TabStops() const {
  std::vector<Window*> stops;
  for (const auto& control : controls) {
    const bool isStop = (control->style & kTabStop) != 0;
    if (isStop && control->IsShown() && control->IsEnabled()) stops.push_back(control.get());
  }
  return stops;
}

HWND Dialog::FirstTabStop() const {
  const std::vector<Window*> stops = TabStops();
  return stops.empty() ? nullptr : stops.front()->handle;
}

void Dialog::TakeFocusFrom(HWND control) {
  if (focus == control) focus = FirstTabStop();
}

Dialog* OpenDialog() {
  return openDialog.get();
}

Window* FindWindowByHandle(HWND handle) {
  if (openDialog == nullptr || handle == nullptr) return nullptr;
  if (openDialog->frame.handle == handle) return &openDialog->frame;
  for (const auto& control : openDialog->controls) {
    if (control->handle == handle) return control.get();
  }
  return nullptr;
}

INT_PTR SendToDialog(UINT message, WPARAM wParam, LPARAM lParam) {
  if (openDialog == nullptr) return 0;
  return openDialog->procedure(openDialog->frame.handle, message, wParam, lParam);
}

LRESULT HandleForDialog(UINT message, WPARAM wParam) {
  if (openDialog == nullptr || (message != kGetDefaultId && message != kSetDefaultId)) return 0;
  if (message == kSetDefaultId) {
    const int id = static_cast<int>(wParam);
    GiveDefaultLook(openDialog->Find(id));
    openDialog->defaultId = id;
    return TRUE;
  }
  if (openDialog->defaultId != 0) return openDialog->defaultId | kHasDefault;
  const Window* const button = openDialog->FindDefaultButton();
  return button != nullptr ? button->id | kHasDefault : 0;
}

void GiveDefaultLook(Window* button) {
  Window* old = openDialog->Find(openDialog->defaultId);
  if (old == nullptr || !old->IsDefaultButton()) old = openDialog->FindDefaultButton();
  if (old != nullptr) old->style &= ~uint32_t{kButtonTypeMask};
  if (button != nullptr && button->kind == WindowKind::kButton) button->style |= BS_DEFPUSHBUTTON;
}

void PostToQueue(const MSG& message) {
  queue.push_back(message);
}

void ForgetMessages(HWND window) {
  std::erase_if(queue, [window](const MSG& message) { return message.hwnd == window; });
}

bool TakeMessage(MSG* message) {
  if (queue.empty()) return false;
  *message = queue.front();
  queue.pop_front();
  return true;
}

void DispatchToWindow(const MSG& message) {
  const Window* const window = FindWindowByHandle(message.hwnd);
  if (window == nullptr) return;
  if (window->kind == WindowKind::kDialog) {
    if (SendToDialog(message.message, message.wParam, message.lParam) == FALSE) {
      HandleForDialog(message.message, message.wParam);
    }
  } else if (message.message == kClickMessage) {
    Click(message.hwnd);
  }
}

bool DispatchNext() {
  MSG message = {};
  if (!TakeMessage(&message)) return false;
  DispatchToWindow(message);
  return true;
}

void Click(HWND handle) {
  Window* const control = FindWindowByHandle(handle);
  if (control == nullptr || !control->IsShown() || !control->IsEnabled()) return;
  if (!openDialog->frame.IsEnabled()) return;
  if (control->kind == WindowKind::kButton) {
    openDialog->focus = handle;
    SendCommand(control->id, 0, handle);
  } else if (control->kind == WindowKind::kStatic && (control->style & kStaticNotify) != 0) {
    SendCommand(control->id, STN_CLICKED, handle);
  } else if (control->kind == WindowKind::kEdit) {
    openDialog->focus = handle;
    control->selectionStart = control->selectionEnd = control->text.size();
  }
}

void PostClick(HWND control) {
  MSG message = {};
  message.hwnd = control;
  message.message = kClickMessage;
  PostToQueue(message);
}

void SendCancel() {
  if (CanCancel()) SendCommand(IDCANCEL, 0, CancelControl());
}

void PostCancel() {
  if (!CanCancel()) return;
  MSG message = {};
  message.hwnd = openDialog->frame.handle;
  message.message = WM_COMMAND;
  message.wParam = IDCANCEL;
  message.lParam = reinterpret_cast<LPARAM>(CancelControl());
  PostToQueue(message);
}

void TypeText(Window* edit, const std::string& text, size_t caret) {
  edit->text = text;
  edit->selectionStart = edit->selectionEnd = caret;
  const HWND handle = edit->handle;
  // The first notice can renumber or destroy the field.
  for (const int notice : {kEditUpdate, kEditChange}) {
    const Window* const told = FindWindowByHandle(handle);
    if (told != nullptr) SendCommand(told->id, notice, handle);
  }
}

void SendCommand(int id, int notification, HWND control) {
  const DWORD word = static_cast<WORD>(id) | static_cast<DWORD>(notification) << 16;
  SendToDialog(WM_COMMAND, word, reinterpret_cast<LPARAM>(control));
}

INT_PTR RunDialog(const DialogTemplate& dialogTemplate, DLGPROC procedure, LPARAM data) {
  if (openDialog != nullptr) return -1;  // one at a time is all that this machine shows
  openDialog = std::make_unique<Dialog>();
  openDialog->procedure = procedure;
  openDialog->frame.handle = NewHandle();
  openDialog->frame.kind = WindowKind::kDialog;
  openDialog->frame.style = dialogTemplate.frame.style;
  openDialog->frame.text = dialogTemplate.frame.text;
  INT_PTR result = -1;
  if (MakeControls(dialogTemplate.controls)) {
    InitDialog(data);
    while (!openDialog->hasEnded) {
      if (!DispatchNext()) TakeUserTurn();
    }
    result = openDialog->result;
  }
  DestroyDialog();
  return result;
}

}  // namespace machine

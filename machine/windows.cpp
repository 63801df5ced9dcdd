#include "machine/windows.h"

#include <algorithm>
#include <deque>
#include <map>

#include "machine/drawing.h"
#include "machine/scripted_user.h"

namespace machine {
namespace {

constexpr uint32_t kTypeMask = 0xF;  // of a button's style
constexpr uint32_t kStaticTypeMask = 0x1F;
constexpr uint32_t kStaticBitmap = 0xE;     // SS_BITMAP
constexpr uint32_t kStaticNotify = 0x100;   // SS_NOTIFY
constexpr uint32_t kListOwnerDrawn = 0x10;  // CBS_OWNERDRAWFIXED
constexpr int kEditUpdate = 0x400;
constexpr int kEditChange = 0x300;

// Stands in the queue for the mouse's messages of one click.
constexpr UINT kClickMessage = 0x201;  // WM_LBUTTONDOWN

std::unique_ptr<Dialog> openDialog;
std::deque<MSG> queue;
uintptr_t lastHandle = 0x10000;

HWND NewHandle() {
  return reinterpret_cast<HWND>(lastHandle += 2);
}

WindowKind KindOf(const std::string& className) {
  static const std::map<std::string, WindowKind> kinds = {{"Static", WindowKind::kStatic},
                                                          {"Edit", WindowKind::kEdit},
                                                          {"Button", WindowKind::kButton},
                                                          {"ComboBox", WindowKind::kComboBox}};
  const auto kind = kinds.find(className);
  return kind != kinds.end() ? kind->second : WindowKind::kStatic;
}

std::unique_ptr<Window> MakeControl(const TemplateItem& item) {
  auto control = std::make_unique<Window>();
  control->handle = NewHandle();
  control->className = item.className;
  control->kind = KindOf(item.className);
  control->id = item.id;
  control->style = item.style;
  control->text = item.text;
  control->hasPicture = control->kind == WindowKind::kStatic &&
                        (item.style & kStaticTypeMask) == kStaticBitmap && item.pictureId != 0;
  control->needsDrawing = true;
  return control;
}

// Comes while the controls are created, before the dialog is initialised.
void MeasureItems(const Window& control) {
  if (control.kind != WindowKind::kComboBox || !control.IsOwnerDrawn()) return;
  MEASUREITEMSTRUCT measure = {};
  measure.CtlType = ODT_COMBOBOX;
  measure.CtlID = static_cast<UINT>(control.id);
  SendToDialog(WM_MEASUREITEM, static_cast<WPARAM>(control.id), reinterpret_cast<LPARAM>(&measure));
}

// Comes for each entry when the list goes.
void DeleteItems(const Window& control) {
  for (size_t index = 0; index < control.items.size(); ++index) {
    DELETEITEMSTRUCT deleted = {};
    deleted.CtlType = ODT_COMBOBOX;
    deleted.CtlID = static_cast<UINT>(control.id);
    deleted.itemID = static_cast<UINT>(index);
    deleted.hwndItem = control.handle;
    deleted.itemData = control.items[index];
    SendToDialog(WM_DELETEITEM, static_cast<WPARAM>(control.id),
                 reinterpret_cast<LPARAM>(&deleted));
  }
}

void DrawControl(Window* control) {
  control->needsDrawing = false;
  DRAWITEMSTRUCT item = {};
  item.CtlID = static_cast<UINT>(control->id);
  item.hwndItem = control->handle;
  item.rcItem = {0, 0, 100, 17};
  if (control->kind == WindowKind::kComboBox) {
    item.CtlType = ODT_COMBOBOX;
    item.itemID = static_cast<UINT>(control->selection);
    const bool isEntry = control->selection >= 0;
    item.itemData = isEntry ? control->items[static_cast<size_t>(control->selection)] : 0;
  }
  item.hDC = BeginDrawing(control);
  SendToDialog(WM_DRAWITEM, static_cast<WPARAM>(control->id), reinterpret_cast<LPARAM>(&item));
  EndDrawing(item.hDC);
}

void Command(int id, int notification, HWND control) {
  const DWORD word = static_cast<WORD>(id) | static_cast<DWORD>(notification) << 16;
  SendToDialog(WM_COMMAND, word, reinterpret_cast<LPARAM>(control));
}

HWND CancelControl() {
  const Window* const control = openDialog->Find(IDCANCEL);
  return control != nullptr ? control->handle : nullptr;
}

void DestroyDialog() {
  // The lists tell of their entries while the dialog still stands.
  for (const auto& control : openDialog->controls) DeleteItems(*control);
  openDialog.reset();
  queue.clear();
}

}  // namespace

bool Window::IsOwnerDrawn() const {
  if (kind == WindowKind::kStatic) return (style & kStaticTypeMask) == SS_OWNERDRAW;
  return kind == WindowKind::kComboBox && (style & kListOwnerDrawn) != 0;
}

Window* Dialog::Find(int id) const {
  const auto found = std::ranges::find_if(
      controls, [id](const std::unique_ptr<Window>& control) { return control->id == id; });
  return found != controls.end() ? found->get() : nullptr;
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

void PostToQueue(const MSG& message) {
  queue.push_back(message);
}

bool TakeMessage(MSG* message) {
  if (queue.empty()) return false;
  *message = queue.front();
  queue.pop_front();
  return true;
}

void DispatchToWindow(const MSG& message) {
  const Window* const window = FindWindowByHandle(message.hwnd);
  if (window == nullptr) return;  // it has gone since
  if (window->kind == WindowKind::kDialog) {
    SendToDialog(message.message, message.wParam, message.lParam);
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
  if (control->kind == WindowKind::kButton) {
    openDialog->focus = handle;
    Command(control->id, 0, handle);
  } else if (control->kind == WindowKind::kStatic && (control->style & kStaticNotify) != 0) {
    Command(control->id, STN_CLICKED, handle);
  } else if (control->kind == WindowKind::kEdit) {
    openDialog->focus = handle;
  }
}

void PostClick(HWND control) {
  MSG message = {};
  message.hwnd = control;
  message.message = kClickMessage;
  PostToQueue(message);
}

// A control of that id that is disabled makes Windows ignore the key and the box.
void SendCancel() {
  const Window* const control = openDialog->Find(IDCANCEL);
  if (control == nullptr || control->IsEnabled()) Command(IDCANCEL, 0, CancelControl());
}

void PostCancel() {
  MSG message = {};
  message.hwnd = openDialog->frame.handle;
  message.message = WM_COMMAND;
  message.wParam = IDCANCEL;
  message.lParam = reinterpret_cast<LPARAM>(CancelControl());
  PostToQueue(message);
}

void TypeText(Window* edit, const std::string& text) {
  edit->text = text;
  Command(edit->id, kEditUpdate, edit->handle);
  Command(edit->id, kEditChange, edit->handle);
}

void DrawControls() {
  for (size_t index = 0; openDialog != nullptr && index < openDialog->controls.size(); ++index) {
    Window* const control = openDialog->controls[index].get();
    if (control->needsDrawing && control->IsShown() && control->IsOwnerDrawn()) {
      DrawControl(control);
    }
  }
}

INT_PTR RunDialog(const DialogTemplate& dialogTemplate, DLGPROC procedure, LPARAM data) {
  if (openDialog != nullptr) return -1;  // one at a time is all that this machine shows
  openDialog = std::make_unique<Dialog>();
  openDialog->procedure = procedure;
  openDialog->frame.handle = NewHandle();
  openDialog->frame.kind = WindowKind::kDialog;
  openDialog->frame.style = dialogTemplate.frame.style;
  openDialog->frame.text = dialogTemplate.frame.text;
  for (const TemplateItem& item : dialogTemplate.controls) {
    openDialog->controls.push_back(MakeControl(item));
    MeasureItems(*openDialog->controls.back());
  }
  SendToDialog(WM_INITDIALOG, 0, data);
  while (!openDialog->hasEnded) {
    if (!DispatchNext()) TakeUserTurn();
  }
  const INT_PTR result = openDialog->result;
  DestroyDialog();
  return result;
}

}  // namespace machine

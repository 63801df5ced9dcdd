// The Win32 functions on the dialog, its controls and its messages.
#include <cstring>
#include <string>
#include <utility>

#include "machine/faults.h"
#include "machine/own_resource.h"
#include "machine/owner_drawing.h"
#include "machine/scripted_user.h"
#include "machine/windows.h"

using machine::CallFails;
using machine::FindWindowByHandle;
using machine::OpenDialog;
using machine::Window;
using machine::WindowKind;

namespace {

std::string TextOf(LPCSTR text) {
  return text != nullptr ? text : "";
}

void ChangeText(Window* window, const std::string& text) {
  window->needsDrawing = true;
  if (window->kind == WindowKind::kEdit) {
    machine::TypeText(window, text);  // an edit field tells of every change
  } else {
    window->text = text;
  }
}

LRESULT GetText(const Window& window, WPARAM size, char* buffer) {
  if (size == 0 || buffer == nullptr) return 0;
  const size_t length = std::min<size_t>(window.text.size(), size - 1);
  std::memcpy(buffer, window.text.data(), length);
  buffer[length] = '\0';
  return static_cast<LRESULT>(length);
}

bool HasItem(const Window& list, WPARAM index) {
  return index < list.items.size();
}

// An owner-drawn list without strings keeps what it is given for an entry.
LRESULT SendToList(Window* list, UINT message, WPARAM wParam, LPARAM lParam) {
  switch (message) {
    case CB_ADDSTRING:
      list->items.push_back(static_cast<ULONG_PTR>(lParam));
      return static_cast<LRESULT>(list->items.size()) - 1;
    case CB_GETCOUNT:
      return static_cast<LRESULT>(list->items.size());
    case CB_GETCURSEL:
      return list->selection;
    case CB_RESETCONTENT:
      machine::DeleteItems(*list);
      list->items.clear();
      list->selection = -1;
      return TRUE;
    case CB_SETCURSEL:
      list->selection = HasItem(*list, wParam) ? static_cast<int>(wParam) : -1;
      list->needsDrawing = true;
      return list->selection;
    case CB_GETITEMDATA:
      return HasItem(*list, wParam) ? static_cast<LRESULT>(list->items[wParam]) : CB_ERR;
    case CB_SETITEMDATA:
      if (!HasItem(*list, wParam)) return CB_ERR;
      list->items[wParam] = static_cast<ULONG_PTR>(lParam);
      return TRUE;
    default:
      return 0;
  }
}

// Only the type changes, not the style's other bits.
void SetButtonType(Window* button, WPARAM type) {
  using machine::kButtonTypeMask;
  button->style =
      (button->style & ~kButtonTypeMask) | (static_cast<uint32_t>(type) & kButtonTypeMask);
}

// A negative end is that of the text.
void Select(Window* edit, WPARAM start, LPARAM end) {
  const size_t size = edit->text.size();
  edit->selectionEnd = end < 0 ? size : std::min(static_cast<size_t>(end), size);
  edit->selectionStart = std::min(static_cast<size_t>(start), edit->selectionEnd);
}

LRESULT SendToControl(Window* control, UINT message, WPARAM wParam, LPARAM lParam) {
  switch (message) {
    case WM_SETTEXT:
      ChangeText(control, TextOf(reinterpret_cast<LPCSTR>(lParam)));
      return TRUE;
    case WM_GETTEXT:
      return GetText(*control, wParam, reinterpret_cast<char*>(lParam));
    case WM_SETFONT:
      control->font = reinterpret_cast<HGDIOBJ>(wParam);
      control->needsDrawing = true;
      return 0;
    case BM_SETSTYLE:
      if (control->kind == WindowKind::kButton) SetButtonType(control, wParam);
      return 0;
    case EM_SETSEL:
      Select(control, wParam, lParam);
      return 0;
    default:
      if (control->kind == WindowKind::kDialog) return machine::HandleForDialog(message, wParam);
      return control->kind == WindowKind::kComboBox ? SendToList(control, message, wParam, lParam)
                                                    : 0;
  }
}

}  // namespace

extern "C" {

INT_PTR DialogBoxParamA(HINSTANCE, LPCSTR id, HWND, DLGPROC procedure, LPARAM data) {
  if (CallFails("DialogBoxParamA")) return -1;
  machine::RequireUser();
  constexpr int kDialogType = 5;
  const auto bytes =
      machine::OwnResource(kDialogType, static_cast<int>(reinterpret_cast<uintptr_t>(id)));
  const auto dialog = bytes ? machine::ReadDialogTemplate(*bytes) : std::nullopt;
  return dialog ? machine::RunDialog(*dialog, procedure, data) : -1;
}

BOOL EndDialog(HWND window, INT_PTR result) {
  machine::Dialog* const dialog = OpenDialog();
  if (CallFails("EndDialog") || dialog == nullptr || window != dialog->frame.handle) return FALSE;
  dialog->hasEnded = true;
  dialog->result = result;
  return TRUE;
}

HWND GetDlgItem(HWND window, int id) {
  const machine::Dialog* const dialog = OpenDialog();
  if (CallFails("GetDlgItem") || dialog == nullptr || window != dialog->frame.handle)
    return nullptr;
  const Window* const control = dialog->Find(id);
  return control != nullptr ? control->handle : nullptr;
}

LONG GetWindowLongA(HWND handle, int index) {
  const Window* const window = FindWindowByHandle(handle);
  if (CallFails("GetWindowLongA") || window == nullptr) return 0;
  if (index == GWL_ID) return window->id;
  return index == GWL_STYLE ? static_cast<LONG>(window->style) : 0;
}

LONG SetWindowLongA(HWND handle, int index, LONG value) {
  Window* const window = FindWindowByHandle(handle);
  if (CallFails("SetWindowLongA") || window == nullptr) return 0;
  if (index == GWL_ID) return std::exchange(window->id, value);
  if (index != GWL_STYLE) return 0;
  window->needsDrawing = true;
  return static_cast<LONG>(std::exchange(window->style, static_cast<uint32_t>(value)));
}

BOOL ShowWindow(HWND handle, int show) {
  Window* const window = FindWindowByHandle(handle);
  if (CallFails("ShowWindow") || window == nullptr) return FALSE;
  const bool wasShown = window->IsShown();
  if (show == SW_HIDE) {
    window->style &= ~static_cast<uint32_t>(WS_VISIBLE);
    OpenDialog()->TakeFocusFrom(handle);
  } else {
    window->style |= static_cast<uint32_t>(WS_VISIBLE);
    window->needsDrawing = true;
  }
  return wasShown;
}

// A control that is disabled with the focus on it leaves the focus nowhere.
BOOL EnableWindow(HWND handle, BOOL enable) {
  Window* const window = FindWindowByHandle(handle);
  if (CallFails("EnableWindow") || window == nullptr) return FALSE;
  const bool wasDisabled = !window->IsEnabled();
  if (enable != FALSE) {
    window->style &= ~static_cast<uint32_t>(WS_DISABLED);
  } else {
    window->style |= static_cast<uint32_t>(WS_DISABLED);
    if (OpenDialog()->focus == handle) OpenDialog()->focus = nullptr;
  }
  return wasDisabled;
}

BOOL IsWindow(HWND handle) {
  return !CallFails("IsWindow") && FindWindowByHandle(handle) != nullptr;
}

BOOL DestroyWindow(HWND handle) {
  const Window* const window = FindWindowByHandle(handle);
  if (CallFails("DestroyWindow") || window == nullptr || window->kind == WindowKind::kDialog) {
    return FALSE;
  }
  machine::DeleteItems(*window);
  machine::ForgetMessages(handle);
  std::erase_if(OpenDialog()->controls,
                [handle](const auto& control) { return control->handle == handle; });
  OpenDialog()->TakeFocusFrom(handle);
  return TRUE;
}

// No control, for null, leaves the focus nowhere. The dialog passes it on. Windows also tells the
// dialog, with notices of the controls, that it has moved.
HWND SetFocus(HWND handle) {
  machine::Dialog* const dialog = OpenDialog();
  if (CallFails("SetFocus") || dialog == nullptr) return nullptr;
  if (handle == nullptr) return std::exchange(dialog->focus, nullptr);
  const Window* const window = FindWindowByHandle(handle);
  if (window == nullptr || !window->IsEnabled()) return nullptr;
  const bool isDialog = window->kind == WindowKind::kDialog;
  return std::exchange(dialog->focus, isDialog ? dialog->FirstTabStop() : handle);
}

BOOL SetWindowTextA(HWND handle, LPCSTR text) {
  Window* const window = FindWindowByHandle(handle);
  if (CallFails("SetWindowTextA") || window == nullptr) return FALSE;
  ChangeText(window, TextOf(text));
  return TRUE;
}

// A fault is answered as by a window that can't do what it is told: CB_ERR for the messages of a
// list, 0 for all others.
LRESULT SendMessageA(HWND handle, UINT message, WPARAM wParam, LPARAM lParam) {
  if (CallFails("SendMessageA")) {
    return message >= CB_ADDSTRING && message <= CB_SETITEMDATA ? CB_ERR : 0;
  }
  Window* const window = FindWindowByHandle(handle);
  if (window == nullptr) return 0;
  // What the dialog's procedure returns tells only whether it has handled the message; if not, the
  // system does what it does for every window.
  const bool isDialog = window->kind == WindowKind::kDialog;
  if (isDialog && machine::SendToDialog(message, wParam, lParam) != FALSE) return 0;
  return SendToControl(window, message, wParam, lParam);
}

// A message to no window, for null, waits like others, and is dispatched to nobody.
BOOL PostMessageA(HWND handle, UINT message, WPARAM wParam, LPARAM lParam) {
  const bool isForNobody = handle != nullptr && FindWindowByHandle(handle) == nullptr;
  if (CallFails("PostMessageA") || isForNobody) return FALSE;
  MSG posted = {};
  posted.hwnd = handle;
  posted.message = message;
  posted.wParam = wParam;
  posted.lParam = lParam;
  machine::PostToQueue(posted);
  return TRUE;
}

// Any message of any window, and taken out of the queue: the only form that is understood. Only the
// program's own loop comes here: the dialog's and the message box's take from the queue themselves.
// It is the moment at which a scripted user acts inside a running step.
BOOL PeekMessageA(LPMSG message, HWND window, UINT first, UINT last, UINT remove) {
  if (CallFails("PeekMessageA")) return FALSE;
  const bool wantsAny = window == nullptr && first == 0 && last == 0;
  if (message == nullptr || !wantsAny || remove != PM_REMOVE) return FALSE;
  machine::UserAtPoll();
  return machine::TakeMessage(message);
}

BOOL TranslateMessage(const MSG*) {
  (void)CallFails("TranslateMessage");
  return FALSE;
}

LRESULT DispatchMessageA(const MSG* message) {
  if (CallFails("DispatchMessageA") || message == nullptr) return 0;
  machine::DispatchToWindow(*message);
  return 0;
}

}  // extern "C"

// The windows of the stand-in machine: one dialog at a time with its controls, and the queue of
// posted messages. Where real Windows does more, the comment at the place says so.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "machine/dialog_template.h"
#include "platform/win32.h"

namespace machine {

enum class WindowKind { kDialog, kStatic, kEdit, kButton, kComboBox };

struct Window {
  HWND handle = nullptr;
  WindowKind kind = WindowKind::kStatic;
  std::string className;
  int id = 0;
  uint32_t style = 0;  // WS_VISIBLE and WS_DISABLED tell its state
  std::string text;
  bool hasPicture = false;
  std::vector<ULONG_PTR> items;  // of an owner-drawn list: what the program gave for each
  int selection = -1;
  bool needsDrawing = false;         // of an owner-drawn control
  std::vector<std::string> drawing;  // the calls of its last drawing

  bool IsShown() const { return (style & WS_VISIBLE) != 0; }
  bool IsEnabled() const { return (style & WS_DISABLED) == 0; }
  bool IsOwnerDrawn() const;
};

struct Dialog {
  Window frame;
  std::vector<std::unique_ptr<Window>> controls;  // in tab order
  DLGPROC procedure = nullptr;
  HWND focus = nullptr;
  bool hasEnded = false;
  INT_PTR result = 0;

  Window* Find(int id) const;  // the first control that bears the id now
};

// The dialog that is open; null when none is.
Dialog* OpenDialog();
// A window by its handle; null for none. Handles are never used again.
Window* FindWindowByHandle(HWND handle);

// Calls the dialog's procedure.
INT_PTR SendToDialog(UINT message, WPARAM wParam, LPARAM lParam);

// ---- Messages. First in, first out.

void PostToQueue(const MSG& message);
// Takes the next message; false when there is none.
bool TakeMessage(MSG* message);
void DispatchToWindow(const MSG& message);
// Dispatches the next message; false when there was none.
bool DispatchNext();

// ---- What a user does

// A click on a control. On one that is hidden or disabled it has no effect, as on Windows, where it
// reaches the dialog under the control. A button takes the focus.
void Click(HWND control);
// A click that waits in the queue.
void PostClick(HWND control);
// Command 2, also when no control bears that id.
void SendCancel();
void PostCancel();
// Puts a text in an edit field, with its notices to the dialog.
void TypeText(Window* edit, const std::string& text);

// Lets every owner-drawn control that needs it draw itself.
void DrawControls();

// Runs a dialog to its end, and gives the result. -1 for a template that can't be read.
INT_PTR RunDialog(const DialogTemplate& dialogTemplate, DLGPROC procedure, LPARAM data);

}  // namespace machine

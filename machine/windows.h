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

inline constexpr uint32_t kButtonTypeMask = 0xF;  // of a button's style
inline constexpr uint32_t kStaticTypeMask = 0x1F;

enum class WindowKind { kDialog, kStatic, kEdit, kButton, kComboBox };

// What was drawn on an owner-drawn control or entry. Colours are RRGGBB, or the word for one of the
// system's that differs from PC to PC: "face", "highlight".
struct Drawing {
  std::vector<std::string> calls;  // in their order, as drawing.h has them
  std::string colors;              // of the last text: "RRGGBB on RRGGBB"; "" for none
  int picture = 0;                 // the last one's resource; 0 for none
};

struct Window {
  HWND handle = nullptr;
  WindowKind kind = WindowKind::kStatic;
  std::string className;
  int id = 0;
  uint32_t style = 0;  // WS_VISIBLE and WS_DISABLED tell its state
  std::string text;
  bool hasPicture = false;
  LONG width = 0;  // in pixels, as the height
  LONG height = 0;
  HGDIOBJ font = nullptr;     // that the program gave it
  size_t selectionStart = 0;  // in the text of an edit field; what is typed replaces the selection
  size_t selectionEnd = 0;
  std::vector<ULONG_PTR> items;  // of an owner-drawn list: what the program gave for each
  int selection = -1;
  UINT itemHeight = 0;        // of an owner-drawn list: as the program has measured it
  bool needsDrawing = false;  // of an owner-drawn control
  Drawing drawing;            // its last one

  bool IsShown() const { return (style & WS_VISIBLE) != 0; }
  bool IsEnabled() const { return (style & WS_DISABLED) == 0; }
  bool IsOwnerDrawn() const;
  bool IsDefaultButton() const;
};

struct Dialog {
  Window frame;
  std::vector<std::unique_ptr<Window>> controls;  // in tab order
  DLGPROC procedure = nullptr;
  HWND focus = nullptr;
  int defaultId = IDOK;  // what the Enter key presses; 0: the first button of that type
  bool hasEnded = false;
  INT_PTR result = 0;

  Window* Find(int id) const;             // the first control that bears the id now
  Window* FindDefaultButton() const;      // the first button of that type
  std::vector<Window*> TabStops() const;  // the controls that the Tab key reaches now
  HWND FirstTabStop() const;              // null for none
  // The control has been hidden or destroyed: Windows gives its focus to the dialog, which gives it
  // to the first control that the Tab key reaches.
  void TakeFocusFrom(HWND control);
};

// The dialog that is open; null when none is.
Dialog* OpenDialog();
// A window by its handle; null for none. Handles are never used again.
Window* FindWindowByHandle(HWND handle);

// Calls the dialog's procedure.
INT_PTR SendToDialog(UINT message, WPARAM wParam, LPARAM lParam);
// What the system does with a message sent that the procedure has not handled, and its answer: it
// tells and sets the default button. 0 for all other messages. Windows does the same with one that
// was posted, also with a private message of that number; here a program's posted messages are its
// own.
LRESULT HandleForDialog(UINT message, WPARAM wParam);
inline constexpr UINT kGetDefaultId = 0x400;  // DM_GETDEFID
// Takes the default button's looks from the button that has them to this one; null for none.
void GiveDefaultLook(Window* button);

// ---- Messages. First in, first out.

void PostToQueue(const MSG& message);
// Takes away what waits for a window that goes.
void ForgetMessages(HWND window);
// Takes the next message; false when there is none.
bool TakeMessage(MSG* message);
void DispatchToWindow(const MSG& message);
// Dispatches the next message; false when there was none.
bool DispatchNext();

// ---- What a user does

// A click on a control. On one that is hidden or disabled it has no effect, as on Windows, where it
// reaches the dialog under the control; nor has it while the dialog itself is disabled. A button or
// an edit field takes the focus. Windows' dialog manager then also makes the button that has it the
// default one for as long; not every system does, and here the style stays as the program set it.
void Click(HWND control);
// A click that waits in the queue.
void PostClick(HWND control);
// Command 2, also when no control bears that id.
void SendCancel();
void PostCancel();
// Puts a text in an edit field, the caret at this place in it, and tells the dialog of the change.
void TypeText(Window* edit, const std::string& text, size_t caret = 0);
// A control's notice to the dialog; 0 is a button's click.
void SendCommand(int id, int notification, HWND control);

// Runs a dialog to its end, and gives the result. -1 when one is open already, or for a control of
// a class that is none of the four.
INT_PTR RunDialog(const DialogTemplate& dialogTemplate, DLGPROC procedure, LPARAM data);

}  // namespace machine

// The setup program's dialog with nothing behind it: what any program with such a dialog costs. As
// the program does, it shows its last control in a step of its own, when the window is made.
#include "platform/win32.h"
// After win32.h.
#include "ui/control_ids.h"

namespace {

constexpr WORD kDialogId = 116;
constexpr UINT kStep = WM_APP;

INT_PTR CALLBACK DialogProcedure(HWND dialog, UINT message, WPARAM wParam, LPARAM) {
  if (message == WM_INITDIALOG) {
    ShowWindow(GetDlgItem(dialog, IDC_SPACE), SW_HIDE);
    PostMessageA(dialog, kStep, 0, 0);
  } else if (message == kStep) {
    ShowWindow(GetDlgItem(dialog, IDC_SPACE), SW_SHOW);
  } else if (message == WM_COMMAND && LOWORD(wParam) == IDCANCEL) {
    EndDialog(dialog, 1);
  }
  return FALSE;
}

}  // namespace

int WINAPI WinMain(HINSTANCE instance, HINSTANCE, LPSTR, int) {
  DialogBoxParamA(instance, MAKEINTRESOURCEA(kDialogId), nullptr, DialogProcedure, 0);
  return 1;  // as the setup program, 1 is success
}

// Times a program with the setup program's dialog, from its start until its first page stands:
// until the dialog's last control is shown. Prints the seconds, and ends the program.
//
//   page_watch PROGRAM
//
// Exit status 1 without a page in half a minute, and for a page that offers the update first: then
// the check for older files has ended at one.
#include <windows.h>
// After windows.h.
#include <cstdio>

#include "ui/control_ids.h"

namespace {

constexpr double kMostSeconds = 30;

double Now() {
  LARGE_INTEGER ticks = {}, frequency = {};
  QueryPerformanceCounter(&ticks);
  QueryPerformanceFrequency(&frequency);
  return static_cast<double>(ticks.QuadPart) / static_cast<double>(frequency.QuadPart);
}

HWND FindDialog(DWORD processId) {
  HWND dialog = nullptr;
  while ((dialog = FindWindowExA(nullptr, dialog, "#32770", nullptr)) != nullptr) {
    DWORD owner = 0;
    GetWindowThreadProcessId(dialog, &owner);
    if (owner == processId) return dialog;
  }
  return nullptr;
}

bool IsShown(HWND dialog, int id) {
  const HWND control = GetDlgItem(dialog, id);
  return control != nullptr && (GetWindowLongA(control, GWL_STYLE) & WS_VISIBLE) != 0;
}

// The dialog whose page stands; null when that doesn't come. A look costs little, and the program
// may have to share its processor.
HWND WaitForPage(const PROCESS_INFORMATION& program, double start) {
  while (Now() - start < kMostSeconds && WaitForSingleObject(program.hProcess, 1) == WAIT_TIMEOUT) {
    const HWND dialog = FindDialog(program.dwProcessId);
    // The template shows the control, and WM_INITDIALOG hides it before the dialog itself is shown.
    if (dialog != nullptr && IsWindowVisible(dialog) && IsShown(dialog, IDC_SPACE)) return dialog;
  }
  return nullptr;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  STARTUPINFOA startup = {};
  startup.cb = sizeof startup;
  PROCESS_INFORMATION program = {};
  const double start = Now();
  if (!CreateProcessA(nullptr, argv[1], nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                      &program)) {
    return 2;
  }
  const HWND dialog = WaitForPage(program, start);
  const double seconds = Now() - start;
  const bool isGood =
      dialog != nullptr && LOWORD(SendMessageA(dialog, DM_GETDEFID, 0, 0)) != IDC_UPDATE;
  TerminateProcess(program.hProcess, 0);
  WaitForSingleObject(program.hProcess, INFINITE);
  if (isGood) std::printf("%.6f\n", seconds);
  return isGood ? 0 : 1;
}

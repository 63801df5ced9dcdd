// The program's hooks for a silent run, but with a poll that asks the system each time, window or
// not: what the program would cost without its short cut. Linked in front of the library, it takes
// the place of core/hooks.cpp.
#include "core/hooks.h"

WizardState wizardState;

void ShowMessage(SetupContext*, uint32_t, const char*) {}  // a silent run shows nothing

uint32_t PollCancel() {
  MSG message = {};
  if (PeekMessageA(&message, nullptr, 0, 0, PM_REMOVE) != FALSE) {
    TranslateMessage(&message);
    DispatchMessageA(&message);
  }
  return wizardState.cancelRequested;
}

// How a pass reaches the user.
//
// A pass calls both wherever it goes on, and needn't know whether a dialog looks on. Without one
// nothing is shown, and nobody can ask for a stop.
#pragma once

#include "core/context.h"
#include "platform/win32.h"

inline constexpr int IDC_MESSAGE = 901;  // the dialog's message area

// The state of the one dialog. Only the dialog changes it; in a silent run it stays all zero.
struct WizardState {
  HWND window;               // null while no dialog exists
  uint32_t cancelRequested;  // 1: the user has confirmed a stop
  uint32_t busy;             // phase of the dialog's run, a Busy value of ui/wizard_steps.h
  SetupContext* context;     // not owned
};
extern WizardState wizardState;

// Shows the catalog text, with the file name under it if there is one, and keeps the id in
// context->messageId. Context and file name may be null. Does nothing without a window.
void ShowMessage(SetupContext* context, uint32_t id, const char* fileName);

// Dispatches one waiting message of the thread, for whatever window, if the dialog exists, and
// answers the cancel flag. This is the only re-entry of the program: the dialog's handlers can run
// inside it.
uint32_t PollCancel();

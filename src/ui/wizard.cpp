// The dialog's messages and commands, and where each leads.
//
// A run is a chain of messages: each has one step, which ends by posting the next, so that the
// window paints in between. A pass is one long step, and lets waiting messages through at each poll
// (PollCancel). So a command can arrive in the middle of it: OnCommand decides which then count.
#include "ui/wizard.h"

#include <type_traits>

#include "core/hooks.h"
#include "package/paths.h"
#include "ui/control_ids.h"
#include "ui/held_command.h"
#include "ui/language_list.h"
#include "ui/side_commands.h"
#include "ui/wizard_steps.h"

namespace {

constexpr WORD kDialogId = 116;

// ---- Commands

constexpr WORD kAnyNotification = UINT16_MAX;
constexpr uint32_t kAnyPhase = UINT32_MAX;

struct CommandRow {
  int id;
  WORD notification;
  uint32_t phase;  // a value of `busy`
  void (*carryOut)(SetupContext* context);
};

// A command that starts or ends something does so only in the phase whose page offers it: the key
// Enter gives command 1 also while no page stands, and a second click can be under way when the
// first has hidden the button.
constexpr CommandRow kCommands[] = {
    {IDOK, kAnyNotification, BusyDone, LeaveSuccessPage},
    {IDCANCEL, kAnyNotification, kAnyPhase, AskCancel},
    {IDC_FAILURE_END, kAnyNotification, BusyFailed, LeaveFailurePage},
    {IDC_LOGO, STN_CLICKED, kAnyPhase, OpenWebAddress},
    {IDC_LINK, STN_CLICKED, kAnyPhase, OpenWebAddress},
    {IDC_BROWSE, kAnyNotification, kAnyPhase, BrowseForDirectory},
    {IDC_NEXT, kAnyNotification, BusyIdle, StartInstall},
    {IDC_UPDATE, kAnyNotification, BusyIdle, StartInstall},
    {IDC_REMOVE, kAnyNotification, BusyIdle, StartRemoval},
    {IDC_LANGUAGE, CBN_SELCHANGE, kAnyPhase, SelectListedLanguage},
    {IDC_DETAILS, kAnyNotification, kAnyPhase, OpenLogFile},
};

const CommandRow* FindCommand(WPARAM command) {
  for (const CommandRow& row : kCommands) {
    const bool isNotified =
        row.notification == kAnyNotification || row.notification == HIWORD(command);
    if (row.id == LOWORD(command) && isNotified) return &row;
  }
  return nullptr;
}

// The system disables the dialog for as long as a box or the folder picker stands. No user can mean
// it then, but a command that was posted before is still dispatched by the box's loop: it must not
// open a second question, nor release the context under the handler that waits for the first.
bool IsUnderABox() {
  return (GetWindowLongA(wizardState.window, GWL_STYLE) & WS_DISABLED) != 0;
}

void OnCommand(WPARAM command, HWND control) {
  const CommandRow* const row = FindCommand(command);
  if (wizardState.window == nullptr || row == nullptr || IsUnderABox()) return;
  if (KeepCommand(command, control)) return;
  if (row->phase == kAnyPhase || row->phase == wizardState.busy) row->carryOut(wizardState.context);
}

// ---- Messages

// Carries out a private message; without a context it has failed.
template <auto kStep>
void OnStep(HWND, WPARAM wParam, LPARAM) {
  SetupContext* const context = wizardState.context;
  if (context == nullptr) {
    FailRun(nullptr, StatusInternal);
  } else if constexpr (std::is_invocable_v<decltype(kStep), SetupContext*, int32_t>) {
    kStep(context, static_cast<int32_t>(wParam));
  } else {
    kStep(context);
  }
}

struct MessageRow {
  UINT message;
  void (*handle)(HWND dialog, WPARAM wParam, LPARAM lParam);
};

constexpr MessageRow kMessages[] = {
    {WM_INITDIALOG,
     [](HWND dialog, WPARAM, LPARAM lParam) {
       InitDialog(dialog, reinterpret_cast<SetupContext*>(lParam));
     }},
    {WM_COMMAND,
     [](HWND, WPARAM wParam, LPARAM lParam) { OnCommand(wParam, reinterpret_cast<HWND>(lParam)); }},
    {WM_DRAWITEM,
     [](HWND, WPARAM wParam, LPARAM lParam) {
       DrawControl(wizardState.context, wParam, *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam));
     }},
    {WM_MEASUREITEM,
     [](HWND, WPARAM, LPARAM lParam) {
       MeasureLanguageItem(reinterpret_cast<MEASUREITEMSTRUCT*>(lParam));
     }},
    {WM_DELETEITEM,
     [](HWND, WPARAM, LPARAM lParam) {
       DeleteLanguageItem(*reinterpret_cast<const DELETEITEMSTRUCT*>(lParam));
     }},
    {WM_STEP_LOAD, OnStep<LoadPackage>},
    {WM_STEP_IMAGE_KIND, OnStep<TakeImageKind>},
    {WM_STEP_LANGUAGE, OnStep<SettleLanguage>},
    {WM_STEP_PAGE, OnStep<SetUpPage>},
    {WM_STEP_COPY, OnStep<CopyFiles>},
    {WM_STEP_REGISTER, OnStep<Register>},
    {WM_STEP_REMOVAL_PROGRAM, OnStep<LeaveRemovalProgram>},
    {WM_STEP_INSTALL_DONE, OnStep<FinishInstall>},
    {WM_STEP_REMOVAL_DONE, OnStep<FinishRemoval>},
    {WM_SET_LANGUAGE, OnStep<SetLanguage>},
};

// Answers 0 to every message of the system's, handled or not. After WM_INITDIALOG the system then
// sets no focus: the page does. The program's own are handled whole: two of them have numbers that
// the system would act on.
INT_PTR CALLBACK DialogProcedure(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
  // DM_SETDEFID has the number of WM_STEP_LOAD; a step carries 0, and no control has that id.
  if (message == DM_SETDEFID && wParam != 0) return FALSE;
  for (const MessageRow& row : kMessages) {
    if (row.message != message) continue;
    row.handle(dialog, wParam, lParam);
    return message >= WM_STEP_LOAD ? TRUE : FALSE;
  }
  return FALSE;
}

}  // namespace

StatusCode RunWizard(SetupContext* context) {
  const INT_PTR result = DialogBoxParamA(ModuleHandle(), MAKEINTRESOURCEA(kDialogId), nullptr,
                                         DialogProcedure, reinterpret_cast<LPARAM>(context));
  // -1: the system could not make the dialog at all, so no handler has run.
  return result != -1 ? static_cast<StatusCode>(result) : StatusDialogAborted;
}

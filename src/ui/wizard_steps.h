// What the dialog does: the steps that carry a run forward, and the commands that start or end
// one. ui/wizard.cpp says which message and which control leads to each.
//
// All act on the one dialog of wizardState and on the run's context, which is not null where the
// comment doesn't say otherwise. A step that goes on posts the message of the next one.
#pragma once

#include "core/context.h"
#include "platform/win32.h"

// Private messages, with wParam 0 but for the last. The start runs LOAD, IMAGE_KIND, LANGUAGE,
// PAGE: the numbers are not in order. 1025 and 1026 are numbers of the system's own messages for
// dialogs too, so that the procedure must not leave them unhandled.
inline constexpr UINT WM_STEP_LOAD = 1025;
inline constexpr UINT WM_STEP_IMAGE_KIND = 1026;
inline constexpr UINT WM_STEP_PAGE = 1027;
inline constexpr UINT WM_STEP_LANGUAGE = 1028;
inline constexpr UINT WM_STEP_COPY = 1030;
inline constexpr UINT WM_STEP_REGISTER = 1031;
inline constexpr UINT WM_STEP_REMOVAL_PROGRAM = 1032;
inline constexpr UINT WM_STEP_INSTALL_DONE = 1033;
inline constexpr UINT WM_STEP_REMOVAL_DONE = 1034;
inline constexpr UINT WM_SET_LANGUAGE = 1035;  // wParam: the language

// Values of WizardState::busy.
inline constexpr uint32_t BusyIdle = 0;     // start-up, or a page that waits: Cancel asks, closes
inline constexpr uint32_t BusyWorking = 1;  // Cancel asks, then raises the flag that the pass polls
inline constexpr uint32_t BusyDone = 2;     // success page: Cancel closes
inline constexpr uint32_t BusyFailed = 3;   // failure page: Cancel closes

// The start. InitDialog takes a null context too; the first step then fails.
void InitDialog(HWND dialog, SetupContext* context);
void LoadPackage(SetupContext* context);
void TakeImageKind(SetupContext* context);
void SettleLanguage(SetupContext* context);
void SetUpPage(SetupContext* context);

// Takes the language in force and renews all texts in it.
void SetLanguage(SetupContext* context, int32_t language);
// The command of the list: the language that it shows becomes the one in force, by way of a
// message.
void SelectListedLanguage(SetupContext* context);

// Install and update. The first is the command; a null context does nothing.
void StartInstall(SetupContext* context);
void CopyFiles(SetupContext* context);
void Register(SetupContext* context);
void LeaveRemovalProgram(SetupContext* context);
void FinishInstall(SetupContext* context);

// Removal. The first is the command; a null context does nothing.
void StartRemoval(SetupContext* context);
void FinishRemoval(SetupContext* context);

// The failure page for a status. With a null context it stands all the same: its message from the
// set at offset 0, its button in French.
void FailRun(SetupContext* context, StatusCode status);

// Escape, the close box and the Cancel button: asks, or closes an end page. The context may be
// null.
void AskCancel(SetupContext* context);

// Releases what the dialog and the run hold and ends the dialog with this status. Writes no log: a
// run that is cancelled on a page leaves the old one as it was.
void CloseWizard(StatusCode status);

// The buttons that end the dialog: with the run's result, or with StatusDialogAborted.
void LeaveSuccessPage(SetupContext* context);
void LeaveFailurePage(SetupContext* context);

// Draws a control that draws itself, or an item of the language list. The context may be null.
void DrawControl(const SetupContext* context, WPARAM id, const DRAWITEMSTRUCT& item);

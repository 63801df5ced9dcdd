// The flow of the dialog, in the order of a run.
//
// A page is no window of its own: all pages share the controls, and each sets visibility, text and
// id of those that it uses.
#include "ui/wizard_steps.h"

#include <initializer_list>

#include "core/hooks.h"
#include "core/run_settings.h"
#include "engine/install_pass.h"
#include "engine/removal_pass.h"
#include "engine/update_check.h"
#include "log/event_log.h"
#include "package/package_reader.h"
#include "platform/text.h"
#include "registration/registered_product.h"
#include "registration/removal_program.h"
#include "registration/uninstall_entries.h"
#include "ui/catalog.h"
#include "ui/control_ids.h"
#include "ui/dialog_controls.h"
#include "ui/dialog_look.h"
#include "ui/held_command.h"
#include "ui/language_list.h"

namespace {

LanguageListArt languageArt;

// Shows the language in the list and makes it the one in force, by way of a message.
void SelectLanguage(int32_t language) {
  const HWND list = Control(IDC_LANGUAGE);
  const LRESULT count = SendMessageA(list, CB_GETCOUNT, 0, 0);
  uint32_t selected = 0;
  for (LRESULT index = 0; index < count; ++index) {
    const LanguageItem* const item = LanguageItemAt(wizardState.window, static_cast<WPARAM>(index));
    if (item != nullptr && item->languageOffset == language) selected = item->listIndex;
  }
  SendMessageA(list, CB_SETCURSEL, selected, 0);
  Post(WM_SET_LANGUAGE, static_cast<WPARAM>(language));
}

void MakeDetailsButton(const SetupContext* context) {
  if (context == nullptr) return;
  for (const int id : {IDC_NEXT, IDC_UPDATE, IDC_REMOVE}) {
    const HWND button = Control(id);
    if (IsWindow(button) == FALSE) continue;
    SetWindowLongA(button, GWL_ID, IDC_DETAILS);
    SetControlText(button, CatalogDetails, context->currentLanguage);
    ShowWindow(button, SW_SHOW);
    const LONG style = GetWindowLongA(button, GWL_STYLE);
    if (style != 0) SetWindowLongA(button, GWL_STYLE, style & ~LONG{BS_DEFPUSHBUTTON});
    return;
  }
}

// Makes the rightmost button the end button of an end page.
void MakeEndButton(int id, int32_t language) {
  SetControlText(Control(id), CatalogEnd, language);
  MakeDefault(id);
  SetFocus(Control(id));
}

void SucceedRun(SetupContext* context, uint32_t message, uint32_t event) {
  wizardState.busy = BusyDone;
  ShowMessage(context, message, nullptr);
  Renumber(IDCANCEL, IDOK);
  MakeDetailsButton(context);
  MakeEndButton(IDOK, context->currentLanguage);
  Inform(&context->events, event);
  WriteLogs(&context->events, context->reportFile);
  context->result = StatusOk;
}

int SetUpInstallPage(SetupContext* context) {
  for (const int id : {IDC_DIRECTORY, IDC_BROWSE, IDC_LANGUAGE_LABEL, IDC_LANGUAGE}) Show(id);
  ShowMessage(context, CatalogWelcome, nullptr);
  // Unread: a directory that is no good is refused when the user starts.
  const TextField defaultDirectory(context->header.defaultDirectory);
  (void)ChooseInstallDir(context, context->installDir, sizeof(context->installDir),
                         defaultDirectory.text);
  PutDirectory(*context);
  SelectDirectoryText();
  SetText(IDC_NEXT, CatalogInstall, *context);
  Show(IDC_NEXT);
  return IDC_NEXT;
}

int SetUpRemovalPage(SetupContext* context) {
  DestroyWindow(Control(IDC_REMOVE));
  Renumber(IDC_NEXT, IDC_REMOVE);
  Show(IDC_REMOVE);
  SetText(IDC_REMOVE, CatalogRemove, *context);
  ShowMessage(context, CatalogConfirmRemoval, nullptr);
  return IDCANCEL;
}

// The id that a button gets here is what later steps know an update by (Exists).
int SetUpUpdatePage(SetupContext* context, bool isFree) {
  Renumber(IDC_NEXT, IDC_UPDATE);
  SetText(IDC_UPDATE, CatalogUpdate, *context);
  Show(IDC_UPDATE);
  const bool hasOlder = DetectOlderFiles(context) == 1;
  if (!isFree) EnableWindow(Control(IDC_REMOVE), FALSE);
  if (hasOlder) {
    ShowMessage(context, isFree ? CatalogOlderVersion : CatalogOlderVersionInUse, nullptr);
    return IDC_UPDATE;
  }
  ShowMessage(context, isFree ? CatalogSameVersion : CatalogSameVersionInUse, nullptr);
  return IDCANCEL;
}

// The directory can't be changed while the product is there.
void ShowInstalledProduct(const SetupContext& context) {
  PutDirectory(context);
  for (const int id : {IDC_DIRECTORY, IDC_BROWSE, IDC_LANGUAGE_LABEL, IDC_LANGUAGE, IDC_REMOVE}) {
    Show(id);
  }
  EnableWindow(Control(IDC_DIRECTORY), FALSE);
  EnableWindow(Control(IDC_BROWSE), FALSE);
}

void FailForServices(SetupContext* context, const char* services) {
  FailRun(context, GiveUp(&context->events, EventServicesRemain, services, StatusServicesRemain));
}

// Sends the user back to the directory, with a beep.
void ReturnToDirectory() {
  MessageBeep(MB_ICONEXCLAMATION);
  SetFocus(Control(IDC_DIRECTORY));
  SelectDirectoryText();
}

}  // namespace

void FailRun(SetupContext* context, StatusCode status) {
  wizardState.cancelRequested = 0;
  wizardState.busy = BusyFailed;
  const uint32_t message = MessageForStatus(status);
  ShowMessage(context, message, nullptr);
  Renumber(IDCANCEL, IDC_FAILURE_END);
  MakeDetailsButton(context);
  MakeEndButton(IDC_FAILURE_END, context != nullptr ? context->currentLanguage : kLanguageFrench);
  HideWorkControls();
  if (context == nullptr) return;
  context->result = status;
  context->messageId = message;
  WriteLogs(&context->events, context->reportFile);
}

void CloseWizard(StatusCode status) {
  const HWND dialog = wizardState.window;
  if (wizardState.context != nullptr) (void)CloseSetup(wizardState.context);
  FreeLanguageList(dialog, &languageArt);
  DeleteFonts();
  wizardState.window = nullptr;
  // A dialog that stays open answers its user further, who can try again.
  if (EndDialog(dialog, status) == FALSE) wizardState.window = dialog;
}

// ---- Start: LOAD, IMAGE_KIND, LANGUAGE, PAGE

void InitDialog(HWND dialog, SetupContext* context) {
  wizardState.window = dialog;
  wizardState.context = context;
  wizardState.cancelRequested = 0;
  wizardState.busy = BusyIdle;
  BuildLanguageList(dialog, &languageArt);
  CreateFonts();
  DressControls(dialog);
  HideWorkControls();
  if (context != nullptr) {
    context->messageId = 0;
    RenewTexts(context);
    SelectLanguage(context->currentLanguage);
  }
  Post(WM_STEP_LOAD);
}

void SetLanguage(SetupContext* context, int32_t language) {
  context->currentLanguage = language;
  RenewTexts(context);
}

void LoadPackage(SetupContext* context) {
  const StatusCode status = OpenPackage(context);
  if (status != StatusOk) {
    FailRun(context, status);
    return;
  }
  if (context->language == kLanguageNone) {
    SelectLanguage(context->header.defaultLanguage);
  } else if (context->language != context->header.defaultLanguage) {
    context->header.defaultLanguage = context->language;
    SelectLanguage(context->language);
  }
  Post(WM_STEP_IMAGE_KIND);
}

void TakeImageKind(SetupContext* context) {
  (void)ApplyImageKind(context);
  Post(WM_STEP_LANGUAGE);
}

// The message that takes the language is ahead of the one that sets the page up, so that the page
// is laid out in its final language.
void SettleLanguage(SetupContext* context) {
  (void)ChooseLanguage(context);
  SelectLanguage(context->language);
  Post(WM_STEP_PAGE);
}

// Shows no page when there is nothing to remove, or services stand in the way of a removal.
void SetUpPage(SetupContext* context) {
  const CommandHold hold;  // the check for older files dispatches messages
  (void)FindInstalledProduct(context);
  const bool isRemoval = (context->options & OptionRemove) != 0;
  const bool isFound = context->productFound == 1;
  if (isRemoval && !isFound) {
    StartRemoval(context);
    return;
  }

  int defaultControl = 0;
  if (!isFound) {
    defaultControl = SetUpInstallPage(context);
  } else {
    const bool isFree = CheckDependingServices(nullptr, 0) != 0;
    ShowInstalledProduct(*context);
    if (isRemoval) {
      SetTitle(CatalogRemovalTitle, *context);
      if (!isFree) {
        char services[kEventTextSize] = {};
        (void)CheckDependingServices(services, sizeof(services));
        FailForServices(context, services);
        return;
      }
      defaultControl = SetUpRemovalPage(context);
    } else {
      defaultControl = SetUpUpdatePage(context, isFree);
    }
  }
  MakeDefault(defaultControl);
  (void)ShowSpaceLine(wizardState.window, context);
  Show(IDC_SPACE);
  SetFocus(Control(defaultControl));
}

void StartInstall(SetupContext* context) {
  if (context == nullptr) return;
  context->language = context->currentLanguage;
  context->header.defaultLanguage = context->currentLanguage;
  char directory[kPathSize] = {};
  SendMessageA(Control(IDC_DIRECTORY), WM_GETTEXT, sizeof(directory),
               reinterpret_cast<LPARAM>(directory));
  if (IsValidPath(directory) != 1) {
    ReturnToDirectory();
    return;
  }
  (void)CopyText(context->installDir, directory);  // the same size
  if (CheckDiskSpace(context) != StatusOk) {
    Warn(&context->events, EventNoDiskSpace, context->installDir);
    ShowMessage(context, Exists(IDC_UPDATE) ? CatalogNoSpace : CatalogNoSpaceChooseOther, nullptr);
    ReturnToDirectory();
    return;
  }
  HideWorkControls();
  const bool isUpdate = context->productFound == 1;
  Inform(&context->events, isUpdate ? EventUpdating : EventInstalling);
  ShowMessage(context, isUpdate ? CatalogUpdateBegins : CatalogInstallBegins, nullptr);
  wizardState.busy = BusyWorking;
  Post(WM_STEP_COPY);
}

void CopyFiles(SetupContext* context) {
  const StatusCode status = InstallFiles(context);
  if (status != StatusOk) {
    FailRun(context, status);
    return;
  }
  Post(WM_STEP_REGISTER);
}

void Register(SetupContext* context) {
  ShowMessage(context, CatalogRegistering, nullptr);
  if (RegisterProduct(context) == StatusOk) {
    Inform(&context->events, EventRegistered);
  } else {
    Warn(&context->events, EventNotRegistered);
  }
  Post(WM_STEP_REMOVAL_PROGRAM);
}

void LeaveRemovalProgram(SetupContext* context) {
  char path[kPathSize] = {};
  if (WriteRemovalProgram(context, path, sizeof(path)) == StatusOk) {
    if ((context->options & OptionRegister) != 0) (void)WriteUninstallEntry(context);
    Inform(&context->events, EventRemovalProgramWritten, path);
  } else {
    Warn(&context->events, EventRemovalProgramFailed, path);
  }
  Post(WM_STEP_INSTALL_DONE);
}

void FinishInstall(SetupContext* context) {
  SucceedRun(context, Exists(IDC_UPDATE) ? CatalogUpdateDone : CatalogInstallDone,
             EventInstallSucceeded);
}

// ---- Removal: all in one handler, then REMOVAL_DONE

void StartRemoval(SetupContext* context) {
  if (context == nullptr) return;
  Inform(&context->events, EventRemoving);
  HideWorkControls();
  SetTitle(CatalogRemovalTitle, *context);
  char services[kEventTextSize] = {};
  if (CheckDependingServices(services, sizeof(services)) == 0) {
    FailForServices(context, services);
    return;
  }
  wizardState.busy = BusyWorking;
  if (context->productFound == 1) {
    ShowMessage(context, CatalogDeletingFile, nullptr);
    const StatusCode status = RemoveProductFiles(context);
    if (status != StatusOk) {
      FailRun(context, status);
      return;
    }
  }
  Inform(&context->events, EventUnregistered);
  (void)UnregisterProduct();
  if ((context->options & OptionRegister) != 0) (void)DeleteUninstallEntry();
  (void)ScheduleFinalCleanup();
  Post(WM_STEP_REMOVAL_DONE);
}

void FinishRemoval(SetupContext* context) {
  SucceedRun(context, CatalogRemovalDone, EventRemovalSucceeded);
}

// ---- Commands

void AskCancel(SetupContext* context) {
  if (wizardState.busy == BusyDone || wizardState.busy == BusyFailed) {
    CloseWizard(context != nullptr ? context->result : StatusCancelled);
    return;
  }
  if (context != nullptr) context->result = StatusCancelled;
  char question[kCatalogTextSize] = {};
  char caption[kCatalogTextSize] = {};
  LoadCatalogText(context, CatalogConfirmCancel, question);
  LoadCatalogText(context, CatalogConfirmCancelCaption, caption);
  if (MessageBoxA(wizardState.window, question, caption,
                  MB_YESNO | MB_ICONQUESTION | MB_DEFBUTTON2) == IDNO) {
    return;
  }
  // Asked only now: behind the question the chain of steps went on.
  if (wizardState.busy == BusyWorking) {
    wizardState.cancelRequested = 1;
  } else {
    CloseWizard(StatusCancelled);
  }
}

void LeaveSuccessPage(SetupContext* context) {
  CloseWizard(context->result);
}

void LeaveFailurePage(SetupContext*) {
  CloseWizard(StatusDialogAborted);
}

void SelectListedLanguage(SetupContext*) {
  const LRESULT index = SendMessageA(Control(IDC_LANGUAGE), CB_GETCURSEL, 0, 0);
  const LanguageItem* const item = LanguageItemAt(wizardState.window, static_cast<WPARAM>(index));
  if (item != nullptr) Post(WM_SET_LANGUAGE, static_cast<WPARAM>(item->languageOffset));
}

void DrawControl(const SetupContext* context, WPARAM id, const DRAWITEMSTRUCT& item) {
  switch (id) {
    case IDC_LINK:
      DrawWebAddress(context, item);
      break;
    case IDC_LANGUAGE_LABEL:
      DrawLanguageLabel(context, item);
      break;
    case IDC_LANGUAGE:
      (void)DrawLanguageItem(languageArt, item);  // nothing depends on whether an entry was there
      break;
    default:
      break;
  }
}

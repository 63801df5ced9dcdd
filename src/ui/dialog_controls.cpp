#include "ui/dialog_controls.h"

#include <initializer_list>

#include "core/hooks.h"
#include "ui/catalog.h"
#include "ui/control_ids.h"
#include "ui/dialog_look.h"

HWND Control(int id) {
  return GetDlgItem(wizardState.window, id);
}

bool Exists(int id) {
  return IsWindow(Control(id)) != FALSE;
}

void Post(UINT message, WPARAM wParam, LPARAM lParam) {
  const HWND dialog = wizardState.window;
  if (PostMessageA(dialog, message, wParam, lParam) == FALSE)
    SendMessageA(dialog, message, wParam, lParam);
}

void Show(int id) {
  ShowWindow(Control(id), SW_SHOW);
}

void SetText(int id, uint32_t catalogId, const SetupContext& context) {
  SetControlText(Control(id), catalogId, context.currentLanguage);
}

void SetTitle(uint32_t catalogId, const SetupContext& context) {
  SetControlText(wizardState.window, catalogId, context.currentLanguage);
}

void Renumber(int id, int newId) {
  const HWND control = Control(id);
  if (control != nullptr) SetWindowLongA(control, GWL_ID, newId);
}

void MakeDefault(int id) {
  SendMessageA(wizardState.window, DM_SETDEFID, static_cast<WPARAM>(id), 0);
  SendMessageA(Control(id), BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
}

void PutDirectory(const SetupContext& context) {
  SendMessageA(Control(IDC_DIRECTORY), WM_SETTEXT, 0, reinterpret_cast<LPARAM>(context.installDir));
}

void SelectDirectoryText() {
  SendMessageA(Control(IDC_DIRECTORY), EM_SETSEL, 0, -1);
}

void HideWorkControls() {
  for (const int id : {IDC_DIRECTORY, IDC_BROWSE, IDC_REMOVE, IDC_UPDATE, IDC_NEXT,
                       IDC_LANGUAGE_LABEL, IDC_LANGUAGE, IDC_SPACE}) {
    if (Exists(id)) ShowWindow(Control(id), SW_HIDE);
  }
}

void RenewTexts(SetupContext* context) {
  (void)ValidateLanguage(&context->currentLanguage);
  if (context->currentLanguage == kLanguageNone) context->currentLanguage = kLanguageFrench;
  SetTitle(CatalogInstallTitle, *context);
  SetText(IDC_BANNER, CatalogBanner, *context);
  SetText(IDC_MESSAGE, context->messageId, *context);
  SetText(IDC_LANGUAGE_LABEL, CatalogLanguageLabel, *context);
  SetText(IDC_NEXT, CatalogInstall, *context);
  SetText(IDC_REMOVE, CatalogRemove, *context);
  SetText(IDC_UPDATE, CatalogUpdate, *context);
  SetText(IDCANCEL, CatalogCancel, *context);
  SetText(IDOK, CatalogEnd, *context);
  if (Exists(IDC_SPACE)) (void)ShowSpaceLine(wizardState.window, context);
}

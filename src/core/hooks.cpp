#include "core/hooks.h"

#include "ui/catalog.h"

WizardState wizardState;

void ShowMessage(SetupContext* context, uint32_t id, const char* fileName) {
  if (wizardState.window == nullptr) return;
  if (context != nullptr) context->messageId = id;
  char text[kMessageTextSize] = {};
  LoadCatalogText(context, id, text);
  char composed[kMessageTextSize];
  if (!IsMissingOrEmpty(fileName) &&
      FormatText(composed, sizeof(composed), "%s\n\n%s", text, fileName)) {
    (void)CopyText(text, composed);  // the same size
  }
  SendMessageA(GetDlgItem(wizardState.window, IDC_MESSAGE), WM_SETTEXT, 0,
               reinterpret_cast<LPARAM>(text));
}

uint32_t PollCancel() {
  // Without a window nothing can wait, and asking the system once per kilobyte would cost more than
  // the rest of an install.
  if (wizardState.window != nullptr) {
    MSG message = {};
    if (PeekMessageA(&message, nullptr, 0, 0, PM_REMOVE) != FALSE) {
      TranslateMessage(&message);
      DispatchMessageA(&message);
    }
  }
  return wizardState.cancelRequested;
}

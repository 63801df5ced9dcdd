#include "core/help.h"

#include "core/run_settings.h"
#include "log/event_log.h"
#include "platform/win32.h"
#include "ui/catalog.h"

namespace {

constexpr size_t kSizeTextSize = 32;

void ReportNeededSpace(SetupContext* context, const char* sizeText, uint32_t needed) {
  char text[kEventTextSize] = {};
  (void)FormatText(text, sizeof(text), "%s (%lu bytes)", sizeText,
                   static_cast<unsigned long>(needed));
  Inform(&context->events, EventSpaceNeeded, text);
  WriteReportFile(&context->events, context->reportFile);
}

}  // namespace

void ShowHelp(SetupContext* context) {
  if (context == nullptr) return;
  char help[kCatalogTextSize + 2 * kSizeTextSize + 1] = {};
  char caption[kCatalogTextSize] = {};
  LoadCatalogText(context, CatalogHelp, help, kCatalogTextSize);
  LoadCatalogText(context, CatalogHelpCaption, caption);

  const uint32_t needed = GetNeededSpace(context);
  char size[kSizeTextSize] = {};
  char unit[kSizeTextSize] = {};
  char sizeText[2 * kSizeTextSize] = {};
  (void)FormatSize(needed, size, sizeof(size));
  LoadCatalogText(context, CatalogUnit, unit);
  (void)FormatText(sizeText, sizeof(sizeText), "%s %s", size, unit);

  if ((context->options & OptionSilent) == 0) {
    (void)AppendText(help, sizeText);  // the buffer has room for both
    MessageBoxA(nullptr, help, caption, MB_OK);
  } else if (context->reportFile[0] != '\0') {
    ReportNeededSpace(context, sizeText, needed);
  }
  (void)FreeEventList(&context->events);
}

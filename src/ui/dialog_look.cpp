#include "ui/dialog_look.h"

#include "core/run_settings.h"
#include "package/paths.h"
#include "platform/text.h"
#include "ui/catalog.h"
#include "ui/control_ids.h"

namespace {

constexpr COLORREF kBlue = 0xFF0000;
constexpr COLORREF kWhite = 0xFFFFFF;

struct DialogFont {
  DWORD italic;
  DWORD underline;
  const char* face;  // empty: the system picks one
  HFONT font;        // owned
};

enum FontIndex { kBannerFont, kLinkFont, kLanguageFont };
DialogFont fonts[] = {
    {0, 0, "Times New Roman", nullptr},
    {1, 1, "", nullptr},
    {0, 0, "Arial", nullptr},
};

char webAddress[kPathSize];

void SetFont(HWND dialog, int id, FontIndex index) {
  SendMessageA(GetDlgItem(dialog, id), WM_SETFONT, reinterpret_cast<WPARAM>(fonts[index].font), 1);
}

void MakeOwnerDrawn(HWND control) {
  constexpr LONG kTypeMask = 0xFF;
  const LONG style = GetWindowLongA(control, GWL_STYLE);
  SetWindowLongA(control, GWL_STYLE, (style & ~kTypeMask) | SS_OWNERDRAW);
}

void DrawLine(const DRAWITEMSTRUCT& item, const char* text) {
  RECT rectangle = item.rcItem;
  DrawTextA(item.hDC, text, static_cast<int>(strlen(text)), &rectangle, DT_VCENTER);
}

}  // namespace

void SetControlText(HWND window, uint32_t id, int32_t language) {
  if (window == nullptr) return;
  char text[kCatalogTextSize] = {};
  LoadCatalogTextIn(language, id, text, sizeof(text));
  SetWindowTextA(window, text);
}

StatusCode ShowSpaceLine(HWND dialog, const SetupContext* context) {
  if (context == nullptr) return StatusInternal;
  if (context->header.spaceNeeded == 0) return StatusOk;
  char label[kCatalogTextSize] = {};
  char size[32] = {};
  char unit[32] = {};
  char line[kCatalogTextSize + sizeof(size) + sizeof(unit)] = {};
  LoadCatalogText(context, context->productFound == 1 ? CatalogSpaceOccupied : CatalogSpaceNeeded,
                  label);
  (void)FormatSize(context->header.spaceNeeded, size, sizeof(size));
  LoadCatalogText(context, CatalogUnit, unit);
  (void)FormatText(line, sizeof(line), "%s %s %s", label, size, unit);
  SendMessageA(GetDlgItem(dialog, IDC_SPACE), WM_SETTEXT, 0, reinterpret_cast<LPARAM>(line));
  return StatusOk;
}

void CreateFonts() {
  constexpr int kHeight = 14;
  constexpr int kNormalWeight = 400;
  for (DialogFont& font : fonts) {
    font.font = CreateFontA(kHeight, 0, 0, 0, kNormalWeight, font.italic, font.underline, 0, 0, 0,
                            0, 0, 0, font.face);
  }
}

void DeleteFonts() {
  for (DialogFont& font : fonts) {
    if (font.font != nullptr) DeleteObject(font.font);
    font.font = nullptr;
  }
}

void DressControls(HWND dialog) {
  SetFont(dialog, IDC_BANNER, kBannerFont);
  SetFont(dialog, IDC_LINK, kLinkFont);
  MakeOwnerDrawn(GetDlgItem(dialog, IDC_LINK));
  SetFont(dialog, IDC_LANGUAGE, kLanguageFont);
  SetFont(dialog, IDC_LANGUAGE_LABEL, kLanguageFont);
  MakeOwnerDrawn(GetDlgItem(dialog, IDC_LANGUAGE_LABEL));
}

void DrawWebAddress(const SetupContext* context, const DRAWITEMSTRUCT& item) {
  SetTextColor(item.hDC, kBlue);
  SetBkColor(item.hDC, kWhite);
  if (webAddress[0] == '\0') LoadCatalogText(context, CatalogShownAddress, webAddress);
  DrawLine(item, webAddress);
}

void DrawLanguageLabel(const SetupContext* context, const DRAWITEMSTRUCT& item) {
  SetTextColor(item.hDC, kDarkGreen);
  char label[kPathSize] = {};
  LoadCatalogText(context, CatalogLanguageLabel, label);
  // The system clears nothing here: a label in another language that was longer would show its end.
  DrawLine(item, "                              ");
  DrawLine(item, label);
}

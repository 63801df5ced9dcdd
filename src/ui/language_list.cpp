#include "ui/language_list.h"

#include <cstdlib>
#include <cstring>
#include <new>

#include "package/paths.h"
#include "ui/catalog.h"
#include "ui/control_ids.h"
#include "ui/dialog_look.h"

namespace {

constexpr WORD kFirstFlag = 120;
constexpr int kUsualCount = 5;
constexpr int kMostLanguages = 10;

HWND List(HWND dialog) {
  return GetDlgItem(dialog, IDC_LANGUAGE);
}

// What the list holds for an entry, if it is an item: the list answers -1 for none.
LanguageItem* AsItem(ULONG_PTR data) {
  if (data == 0 || data == static_cast<ULONG_PTR>(-1)) return nullptr;
  LanguageItem* const item = reinterpret_cast<LanguageItem*>(data);
  return item->size == kLanguageItemSize ? item : nullptr;
}

void ReleaseItem(LanguageItem* item) {
  if (item->bitmap != nullptr) DeleteObject(item->bitmap);
  delete item;
}

int CountLanguages() {
  char text[kCatalogTextSize] = {};
  LoadCatalogText(nullptr, CatalogLanguageCount, text);
  const int count = atoi(text);
  return count >= 1 && count <= kMostLanguages ? count : kUsualCount;
}

int32_t LanguageOfEntry(int entry) {
  constexpr int32_t kLanguages[] = {kLanguageEnglish, kLanguageFrench, kLanguageGerman,
                                    kLanguageItalian};
  return entry < 4 ? kLanguages[entry] : kLanguageSpanish;
}

HBITMAP LoadFlag(int entry) {
  return LoadBitmapA(ModuleHandle(), MAKEINTRESOURCEA(kFirstFlag + entry));
}

// The entry's item, added to the list, which owns it then; null when there is no memory for it or
// no room in the list.
LanguageItem* AddItem(HWND list, int entry) {
  LanguageItem* const item = new (std::nothrow) LanguageItem{};
  if (item == nullptr) return nullptr;
  item->size = kLanguageItemSize;
  item->languageOffset = LanguageOfEntry(entry);
  LoadCatalogText(nullptr, CatalogFirstLanguageName + static_cast<uint32_t>(entry), item->name);
  item->bitmap = LoadFlag(entry);
  const LRESULT index = SendMessageA(list, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(item));
  if (index == CB_ERR || index == CB_ERRSPACE) {
    ReleaseItem(item);
    return nullptr;
  }
  item->listIndex = static_cast<uint32_t>(index);
  return item;
}

void DeleteBrush(HBRUSH* brush) {
  if (*brush != nullptr) DeleteObject(*brush);
  *brush = nullptr;
}

void DrawFlag(const LanguageListArt& art, const DRAWITEMSTRUCT& item, HBITMAP flag) {
  // Nothing stays selected: a flag in a device context could not be deleted.
  const HGDIOBJ previous = SelectObject(art.memoryDC, flag);
  BitBlt(item.hDC, item.rcItem.left + 2, item.rcItem.top + 1, art.bitmapInfo.bmWidth,
         art.bitmapInfo.bmHeight, art.memoryDC, 0, 0, SRCCOPY);
  SelectObject(art.memoryDC, previous);
}

void DrawEntry(const LanguageListArt& art, const DRAWITEMSTRUCT& item, const LanguageItem& entry) {
  const RECT& area = item.rcItem;
  PatBlt(item.hDC, area.left, area.top, area.right - area.left, area.bottom - area.top, PATCOPY);
  DrawFlag(art, item, entry.bitmap);
  RECT text = area;
  text.left += art.bitmapInfo.bmWidth + 5;
  DrawTextA(item.hDC, entry.name, static_cast<int>(strlen(entry.name)), &text,
            DT_VCENTER | DT_SINGLELINE);
  if ((item.itemState & ODS_FOCUS) != 0) DrawFocusRect(item.hDC, &area);
}

}  // namespace

int BuildLanguageList(HWND dialog, LanguageListArt* art) {
  if (art == nullptr) return 0;
  *art = {};
  const HWND list = List(dialog);
  if (list == nullptr) return 0;  // nobody would own the items
  const int count = CountLanguages();
  HBITMAP flag = nullptr;
  for (int entry = 0; entry < count; ++entry) {
    const LanguageItem* const item = AddItem(list, entry);
    if (item == nullptr) {
      FreeLanguageList(dialog, art);
      SendMessageA(list, CB_RESETCONTENT, 0, 0);  // the entries, which hold no items any more
      ShowWindow(list, SW_HIDE);
      return 0;
    }
    flag = item->bitmap;
  }
  const HDC dc = GetDC(dialog);
  art->selectedBrush = CreateSolidBrush(GetSysColor(COLOR_HIGHLIGHT));
  art->normalBrush = CreateSolidBrush(GetSysColor(COLOR_WINDOW));
  art->memoryDC = CreateCompatibleDC(dc);
  GetObjectA(flag, sizeof(art->bitmapInfo), &art->bitmapInfo);
  ReleaseDC(dialog, dc);
  return 1;
}

int FreeLanguageList(HWND dialog, LanguageListArt* art) {
  if (art == nullptr) return 0;
  // First, since a flag that could not be taken out of it can't be deleted while it stands.
  if (art->memoryDC != nullptr) DeleteDC(art->memoryDC);
  const HWND list = List(dialog);
  const LRESULT count = SendMessageA(list, CB_GETCOUNT, 0, 0);
  for (LRESULT index = 0; index < count; ++index) {
    LanguageItem* const item = LanguageItemAt(dialog, static_cast<WPARAM>(index));
    if (item == nullptr) continue;
    // First out of the list's reach, so that its notice of the deleted entry finds nothing. An item
    // that stays in reach is released by that notice.
    if (SendMessageA(list, CB_SETITEMDATA, static_cast<WPARAM>(index), 0) != CB_ERR) {
      ReleaseItem(item);
    }
  }
  DeleteBrush(&art->selectedBrush);
  DeleteBrush(&art->normalBrush);
  *art = {};
  return 1;
}

LanguageItem* LanguageItemAt(HWND dialog, WPARAM index) {
  return AsItem(static_cast<ULONG_PTR>(SendMessageA(List(dialog), CB_GETITEMDATA, index, 0)));
}

void MeasureLanguageItem(MEASUREITEMSTRUCT* measure) {
  if (measure->CtlType != ODT_COMBOBOX || measure->CtlID != static_cast<UINT>(IDC_LANGUAGE)) return;
  BITMAP flag = {};
  const HBITMAP bitmap = LoadFlag(0);
  GetObjectA(bitmap, sizeof(flag), &flag);
  if (bitmap != nullptr) DeleteObject(bitmap);
  measure->itemHeight = static_cast<UINT>(flag.bmHeight) + 2;
}

int DrawLanguageItem(const LanguageListArt& art, const DRAWITEMSTRUCT& item) {
  const bool isSelected = (item.itemState & ODS_SELECTED) != 0;
  const HGDIOBJ previous = SelectObject(item.hDC, isSelected ? art.selectedBrush : art.normalBrush);
  SetBkColor(item.hDC, GetSysColor(isSelected ? COLOR_HIGHLIGHT : COLOR_WINDOW));
  SetTextColor(item.hDC, isSelected ? GetSysColor(COLOR_HIGHLIGHTTEXT) : kDarkGreen);
  const LanguageItem* const entry =
      AsItem(static_cast<ULONG_PTR>(SendMessageA(item.hwndItem, CB_GETITEMDATA, item.itemID, 0)));
  if (entry != nullptr) DrawEntry(art, item, *entry);
  SelectObject(item.hDC, previous);
  return entry != nullptr ? 1 : 0;
}

void DeleteLanguageItem(const DELETEITEMSTRUCT& deleted) {
  if (deleted.CtlID != static_cast<UINT>(IDC_LANGUAGE)) return;
  LanguageItem* const item = AsItem(deleted.itemData);
  if (item != nullptr) ReleaseItem(item);
}

// The list of languages, a flag and a name each. The list holds pointers to its items, which it
// draws itself; it is disabled for the whole run and shows the language in force.
#pragma once

#include <cstdint>

#include "core/context.h"
#include "platform/win32.h"

inline constexpr uint32_t kLanguageItemSize = 48;  // the mark that readers of an item test

// The record behind an entry of the list; owned by the list.
struct LanguageItem {
  uint32_t size;           // kLanguageItemSize in every build
  int32_t languageOffset;  // kLanguage value
  char name[32];           // in the language itself
  uint32_t listIndex;      // that the list gave the entry
  HBITMAP bitmap;          // the flag; owned
};

// What the drawing needs; one static record.
struct LanguageListArt {
  HBRUSH selectedBrush;  // owned
  HBRUSH normalBrush;    // owned
  HDC memoryDC;          // owned; each flag is selected into it while it is drawn
  BITMAP bitmapInfo;     // of the last flag loaded; its size serves for all
};

// Fills the list. Returns 1, or 0 with the list empty and hidden when an item can't be made or
// added; 0 for a null art.
int BuildLanguageList(HWND dialog, LanguageListArt* art);

// Releases all items and the art. The list's own notices of deleted items find nothing left to do.
// Returns 1, or 0 for a null art.
int FreeLanguageList(HWND dialog, LanguageListArt* art);

// The item at an index of the list; null for none.
LanguageItem* LanguageItemAt(HWND dialog, WPARAM index);

// Answers WM_MEASUREITEM for the list, which comes before the dialog is initialised.
void MeasureLanguageItem(MEASUREITEMSTRUCT* measure);

// Returns 1, or 0 with nothing drawn for an entry without an item: while nothing is selected, the
// list's field is one.
int DrawLanguageItem(const LanguageListArt& art, const DRAWITEMSTRUCT& item);

// Answers WM_DELETEITEM.
void DeleteLanguageItem(const DELETEITEMSTRUCT& deleted);

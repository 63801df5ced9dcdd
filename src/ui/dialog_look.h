// The looks of the dialog: texts that come from the catalog, fonts, and the two controls that the
// program draws itself, the web address and the language label.
#pragma once

#include "core/context.h"
#include "platform/win32.h"

// Sets the text of a window, the dialog's title included, to a row of the catalog in the given
// language (the system's for kLanguageNone). A row that doesn't exist gives an empty text. Does
// nothing for a null window.
void SetControlText(HWND window, uint32_t id, int32_t language);

// Sets the disk space line: needed, or occupied when a product was found. A package that needs none
// leaves the line as it was. Returns 1, or StatusInternal for a null context.
StatusCode ShowSpaceLine(HWND dialog, const SetupContext* context);

// The three fonts live from the one call to the other. A font that can't be made leaves its
// controls with the system's.
void CreateFonts();
void DeleteFonts();

inline constexpr COLORREF kDarkGreen = 0x6400;  // of the language label and its list

// Gives the controls their fonts, and the web address and the label their owner drawing.
void DressControls(HWND dialog);

// Draw the web address and the language label. The address is read from the catalog at its first
// drawing and kept.
void DrawWebAddress(const SetupContext* context, const DRAWITEMSTRUCT& item);
void DrawLanguageLabel(const SetupContext* context, const DRAWITEMSTRUCT& item);

// Work on the controls of the one dialog, by the ids that they bear now. A control that no longer
// exists, or bears another id, is passed over.
#pragma once

#include "core/context.h"
#include "platform/win32.h"

HWND Control(int id);
bool Exists(int id);

void Show(int id);
void Renumber(int id, int newId);

// Give a control, where it exists, or the dialog itself a text of the catalog, in the language in
// force.
void SetText(int id, uint32_t catalogId, const SetupContext& context);
void SetTitle(uint32_t catalogId, const SetupContext& context);

// Makes a button the default one, which Enter presses: by the dialog's default id and by its looks,
// since systems go by either.
void MakeDefault(int id);

// The edit field of the installation directory.
void PutDirectory(const SetupContext& context);
void SelectDirectoryText();

// Hides all that a page offers; message area, banner, logo, web address and rightmost button stay.
void HideWorkControls();

// Renews all texts but those of the end pages' buttons. A language that is none of the five becomes
// French.
void RenewTexts(SetupContext* context);

// Posts a message to the dialog. One that the system can't post is carried out at once: a chain of
// steps that broke off could no longer be ended by anybody.
void Post(UINT message, WPARAM wParam = 0, LPARAM lParam = 0);

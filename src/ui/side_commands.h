// Three commands beside the dialog's chain of steps. None changes the state of a run, but for the
// directory that the picker puts into the edit field, and nothing that fails in them is told. The
// context may be null.
#pragma once

#include "core/context.h"
#include "platform/win32.h"

// Lets the user pick the installation directory with the system's folder picker.
void BrowseForDirectory(SetupContext* context);

// Starts the command that this user's registry has for web addresses, with the maker's and with the
// rights of the program.
void OpenWebAddress(SetupContext* context);

// Opens the log in whatever shows such files to this user.
void OpenLogFile(SetupContext* context);

// The command line that the system registers for web addresses. Returns 1, or 0 when there is none,
// it doesn't fit, or there is no buffer.
int ReadBrowserCommand(char* buffer, size_t size);

// Replaces each occurrence of a character, or drops it when the replacement is 0. Returns 1, or -1
// for a null text.
int RemoveCharacter(char* text, char character, char replacement);

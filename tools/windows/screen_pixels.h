// What a user sees of the program's windows, told by the pixels on the screen.
#pragma once

#include <windows.h>
// After windows.h.
#include <string>
#include <vector>

// Keeps the pictures of the language list. Before the program runs: it lets nobody read its file.
void ReadPictures(const char* program);

// Of each owner-drawn control that is shown "seen ID COLOR on COLOR": that of its text, the pixel
// most unlike the background. For a list "picture ID", a picture that stands in it, and "height N",
// that of an entry. Colours are RRGGBB, or "face" for that of the system's dialogs.
std::vector<std::string> DescribeDrawn(HWND dialog);

// The system's icon in a control of a box.
std::string SeenIcon(HWND control);

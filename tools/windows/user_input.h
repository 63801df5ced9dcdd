// The pointer and the keyboard of the display, as the system gives them to the window that lies
// there or has the focus. Posted messages come ahead of all input.
#pragma once

#include <windows.h>
// After windows.h.
#include <string>

// A click in the middle of the control's place. What lies there is found out when the program takes
// the message: on a hidden or disabled control it has no effect.
void Click(HWND control);

// With the Shift key held down or not.
void PressKey(WORD key, bool isShifted = false);
void TypeKeys(const std::wstring& text);

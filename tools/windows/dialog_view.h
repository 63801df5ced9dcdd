// What a user sees of the setup program's windows, asked from another process.
//
// Texts are wide or UTF-8. A window that doesn't answer within five seconds has an empty text.
#pragma once

#include <windows.h>
// After windows.h.
#include <string>
#include <vector>

struct ProgramWindows {
  HWND dialog = nullptr;  // the program's own
  HWND modal = nullptr;   // a message box or folder picker above it
};

ProgramWindows FindWindows(DWORD processId);

// The dialog and its controls, line by line, as `show` prints them.
std::vector<std::string> DescribeDialog(HWND dialog);

// True for a page that waits for its user: an end page, or one whose last control is shown. While a
// step works only the rightmost button is there.
bool IsPage(HWND dialog);

// What the message area says now; a running pass answers at its next poll.
std::wstring ReadMessageArea(HWND dialog);

std::vector<HWND> ChildrenOf(HWND window);

// The control with the focus; null for none.
HWND FocusOf(HWND dialog);

bool IsShown(HWND control);
std::wstring TextOf(HWND window);
std::string ClassOf(HWND window);

// Sends a message and waits up to five seconds for the answer; 0 without one.
LRESULT Ask(HWND window, UINT message, WPARAM wParam = 0, LPARAM lParam = 0);

std::wstring Wide(const std::string& utf8);

// In double quotes, with \r, \n, \" and \\ escaped, in UTF-8.
std::string Quoted(const std::wstring& text);

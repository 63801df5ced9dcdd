#include "tests/windows/user_input.h"

#include <iterator>

// A click of the pointer in the middle of the control's place. What lies there is found out when
// the program takes the message; posted messages come first.
void Click(HWND control) {
  constexpr LONG kSteps = 65536;  // across and down the screen
  RECT area = {};
  GetWindowRect(control, &area);
  const LONG x = (area.left + area.right) / 2;
  const LONG y = (area.top + area.bottom) / 2;
  INPUT inputs[3] = {};
  inputs[0].mi.dx = (x * kSteps + kSteps / 2) / GetSystemMetrics(SM_CXSCREEN);
  inputs[0].mi.dy = (y * kSteps + kSteps / 2) / GetSystemMetrics(SM_CYSCREEN);
  inputs[0].mi.dwFlags = MOUSEEVENTF_MOVE | MOUSEEVENTF_ABSOLUTE;
  inputs[1].mi.dwFlags = MOUSEEVENTF_LEFTDOWN;
  inputs[2].mi.dwFlags = MOUSEEVENTF_LEFTUP;
  SendInput(std::size(inputs), inputs, sizeof inputs[0]);
}

void PressKey(WORD key) {
  INPUT inputs[2] = {};
  for (INPUT& input : inputs) {
    input.type = INPUT_KEYBOARD;
    input.ki.wVk = key;
  }
  inputs[1].ki.dwFlags = KEYEVENTF_KEYUP;
  SendInput(std::size(inputs), inputs, sizeof inputs[0]);
}

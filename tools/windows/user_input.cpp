#include "tools/windows/user_input.h"

#include <iterator>

namespace {

void SendKey(WORD key, WORD character, DWORD flags) {
  INPUT input = {};
  input.type = INPUT_KEYBOARD;
  input.ki.wVk = key;
  input.ki.wScan = character;
  input.ki.dwFlags = flags;
  SendInput(1, &input, sizeof input);
}

}  // namespace

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

void PressKey(WORD key, bool isShifted) {
  if (isShifted) SendKey(VK_SHIFT, 0, 0);
  SendKey(key, 0, 0);
  SendKey(key, 0, KEYEVENTF_KEYUP);
  if (isShifted) SendKey(VK_SHIFT, 0, KEYEVENTF_KEYUP);
}

void TypeKeys(const std::wstring& text) {
  for (const wchar_t character : text) {
    SendKey(0, character, KEYEVENTF_UNICODE);
    SendKey(0, character, KEYEVENTF_UNICODE | KEYEVENTF_KEYUP);
  }
}

// Message boxes, and windows. No dialog exists on this machine: nobody could use one, so that there
// is no window to find or to send to, and never a message waiting.
#include <cstdio>
#include <string>
#include <string_view>

#include "machine/code_page.h"
#include "machine/faults.h"
#include "platform/win32.h"

namespace {

enum Button {
  kNone = 0,
  kOk = 1,
  kCancel = 2,
  kAbort = 3,
  kRetry = 4,
  kIgnore = 5,
  kYes = 6,
  kNo = 7
};

// By the low four bits of the box's type.
constexpr Button kButtons[][3] = {
    {kOk},       {kOk, kCancel},    {kAbort, kRetry, kIgnore}, {kYes, kNo, kCancel},
    {kYes, kNo}, {kRetry, kCancel},
};

// The next four bits but one number the default button; one that the box lacks is the first.
Button DefaultButton(UINT type) {
  const UINT kind = type & 0xF;
  if (kind >= std::size(kButtons)) return kNone;
  const UINT index = type >> 8 & 0xF;
  const bool exists = index < std::size(kButtons[kind]) && kButtons[kind][index] != kNone;
  return kButtons[kind][exists ? index : 0];
}

std::string TerminalText(std::string_view text) {
  std::string lines;
  for (size_t at = 0; at < text.size(); ++at) {
    const bool isLineEnd = text.substr(at, 2) == "\r\n";
    if (!isLineEnd) lines += text[at];
  }
  return machine::ToUtf8(lines);
}

}  // namespace

extern "C" {

// Nobody is there to press a button: the box is printed and its default button taken.
int MessageBoxA(HWND, LPCSTR text, LPCSTR caption, UINT type) {
  if (machine::CallFails("MessageBoxA")) return 0;
  std::printf("[%s]\n%s\n", TerminalText(caption != nullptr ? caption : "Error").c_str(),
              TerminalText(text != nullptr ? text : "").c_str());
  std::fflush(stdout);
  return DefaultButton(type);
}

HWND GetDlgItem(HWND, int) {
  machine::CallFails("GetDlgItem");
  return nullptr;
}

LRESULT SendMessageA(HWND, UINT, WPARAM, LPARAM) {
  machine::CallFails("SendMessageA");
  return 0;
}

BOOL PeekMessageA(LPMSG, HWND, UINT, UINT, UINT) {
  machine::CallFails("PeekMessageA");
  return FALSE;
}

BOOL TranslateMessage(const MSG*) {
  machine::CallFails("TranslateMessage");
  return FALSE;
}

LRESULT DispatchMessageA(const MSG*) {
  machine::CallFails("DispatchMessageA");
  return 0;
}

}  // extern "C"

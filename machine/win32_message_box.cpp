// Message boxes: answered by the scripted user, or printed when there is none.
#include <cstdio>
#include <string>
#include <string_view>
#include <utility>

#include "machine/code_page.h"
#include "machine/faults.h"
#include "machine/scripted_user.h"
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

// "ICON BUTTONS default BUTTON", the buttons joined by hyphens.
std::string DescribeLook(UINT type) {
  constexpr const char* kIcons[] = {"none", "error", "question", "warning", "information"};
  constexpr const char* kNames[] = {"none",  "ok",     "cancel", "abort",
                                    "retry", "ignore", "yes",    "no"};
  const UINT kind = type & 0xF;
  const UINT icon = type >> 4 & 0xF;
  std::string look = icon < std::size(kIcons) ? kIcons[icon] : "none";
  char separator = ' ';
  for (const Button button : kButtons[kind < std::size(kButtons) ? kind : 0]) {
    if (button == kNone) continue;
    look += std::exchange(separator, '-');
    look += kNames[button];
  }
  return look.append(" default ").append(kNames[DefaultButton(type)]);
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

// Without a user nobody is there to press a button: the box is printed and its default button
// taken.
int MessageBoxA(HWND, LPCSTR text, LPCSTR caption, UINT type) {
  if (machine::CallFails("MessageBoxA")) return 0;
  const std::string shownCaption = caption != nullptr ? caption : "Error";
  const std::string shownText = text != nullptr ? text : "";
  if (machine::HasUser()) {
    return machine::AnswerBox(shownCaption, shownText, type, DescribeLook(type));
  }
  std::printf("[%s]\n%s\n", TerminalText(shownCaption).c_str(), TerminalText(shownText).c_str());
  std::fflush(stdout);
  return DefaultButton(type);
}

BOOL MessageBeep(UINT type) {
  if (machine::CallFails("MessageBeep")) return FALSE;
  if (machine::HasUser()) machine::TellUser("beep " + std::to_string(type));
  return TRUE;
}

}  // extern "C"

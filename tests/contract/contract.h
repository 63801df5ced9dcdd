// The contract of the system: what the program leans on at the edges of the functions of
// platform/win32.h. One source is run on the stand-in machine and under Wine, so that the stand-in
// can't answer otherwise than Windows does.
//
// A case runs in C:\, has a fresh directory C:\contract that holds this program, and the fresh key
// kKey below HKEY_LOCAL_MACHINE. Cases don't lean on each other.
#pragma once

#include <concepts>
#include <functional>
#include <initializer_list>
#include <source_location>
#include <string>
#include <type_traits>

#include "platform/win32.h"

namespace contract {

inline constexpr char kKey[] = "SOFTWARE\\Zeb\\Contract";
inline constexpr char kProgram[] = "C:\\contract\\seam_contract.exe";
inline constexpr int kOwnerMayAll = _S_IREAD | _S_IWRITE;
inline constexpr DWORD kPlain = FILE_ATTRIBUTE_ARCHIVE;
inline constexpr DWORD kFixed = FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY;
inline constexpr DWORD kAbsent = INVALID_FILE_ATTRIBUTES;
inline constexpr DWORD kShareRead = 1, kShareBoth = 3;

// ---- What a case says

// An answer as text; a number by its value alone, since the worlds' types differ.
struct Shown {
  Shown(std::nullptr_t) : text("0") {}
  template <typename Value>
  Shown(const Value& value) {
    if constexpr (std::convertible_to<Value, std::string>) {
      text.append(1, '"').append(value).append(1, '"');
    } else if constexpr (std::is_pointer_v<Value>) {
      text = std::to_string(reinterpret_cast<intptr_t>(value));
    } else {
      text = std::to_string(static_cast<long long>(value));
    }
  }
  std::string text;
};
using Answers = std::initializer_list<Shown>;

// Calls, made from left to right: each has its own answer, or all have the one. Else the case
// fails, and goes on. `row` names the row of a table.
void Expect(Answers actual, Answers expected, const std::string& row = "",
            std::source_location where = std::source_location::current());

// For CONTRACT below.
bool AddCase(const char* name, void (*body)());

// Whether Wine answers, for the few places in which it is known to differ from Windows. Each says
// how.
bool IsWine();

// ---- Files

// One that exists, and one that is made or cut, to be read and written by nobody else.
HANDLE Open(const std::string& name, DWORD access = GENERIC_READ, DWORD share = 0);
HANDLE Create(const std::string& name, DWORD attributes = FILE_ATTRIBUTE_NORMAL);
// Whether an open has worked; what it opened is closed again.
bool Opens(HANDLE file);
// What is read, or "failed"; whether all is written.
std::string Read(HANDLE file, DWORD count);
BOOL Write(HANDLE file, const std::string& bytes);
// A whole file.
void WriteText(const std::string& name, const std::string& bytes);
std::string ReadText(const std::string& name);

// ---- The dialog of contract.rc, with a handler of the case's own

// Messages that are posted: the first by the dialog itself, when it is made.
inline constexpr UINT kStep = 0x8001, kNextStep = 0x8002, kLastStep = 0x8003;
inline constexpr LPARAM kData = 77;  // what WM_INITDIALOG brings

inline bool IsStep(UINT message) {
  return message >= kStep && message <= kLastStep;
}
// A control of the dialog that stands.
HWND Item(int id);
inline uint32_t StyleOf(HWND window) {
  return static_cast<uint32_t>(GetWindowLongA(window, GWL_STYLE));
}

using Handler = std::function<INT_PTR(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam)>;

// The dialog's result.
INT_PTR RunDialog(Handler handler);
// Runs `check` in a dialog that stands, and ends it; the other one when the next step comes.
using Check = std::function<void(HWND dialog)>;
void RunStanding(const Check& check, const Check& atNextStep = nullptr);

// ---- What the world does: under Wine this program, on the stand-in the script contract.user

// A user who answers the next box or picker of this thread, as soon as all that was posted before
// is through: picks the folder, if one is named, and presses the button.
void AnswerNext(int button, const std::string& folder = "");
// The end of a program that was started; on the stand-in none really is.
void WaitForEnd(HANDLE process);

}  // namespace contract

// A case stands in the namespace.
#define CONTRACT(group, title)                                                          \
  static void group##title();                                                           \
  static const bool is##group##title##Known = AddCase(#group "." #title, group##title); \
  static void group##title()

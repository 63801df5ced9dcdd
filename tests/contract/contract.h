// The contract of the system: what the program leans on at the edges of the functions of
// platform/win32.h. One source is run on the stand-in machine and under Wine, so that the stand-in
// can't answer otherwise than Windows does.
//
// A case runs in C:\contract, a fresh directory that holds this program, and below the fresh key
// kKey of HKEY_LOCAL_MACHINE. Cases don't lean on each other.
#pragma once

#include <concepts>
#include <initializer_list>
#include <source_location>
#include <string>
#include <type_traits>

#include "platform/win32.h"

namespace contract {

inline constexpr char kKey[] = "SOFTWARE\\Zeb\\Contract";
inline constexpr char kProgram[] = "C:\\contract\\seam_contract.exe";
inline constexpr int kOwnerMayReadAndWrite = _S_IREAD | _S_IWRITE;

struct Case {
  Case(const char* caseName, void (*caseBody)());
  const char* name;
  void (*body)();
};

// Whether Wine answers, for the few places in which it is known to differ from Windows. Each says
// how.
bool IsWine();

// One side of a comparison as text; a number by its value alone, since the worlds' types differ.
struct Shown {
  template <typename Value>
  Shown(const Value& value) {
    if constexpr (std::is_null_pointer_v<Value>) {
      text += '0';
    } else if constexpr (std::convertible_to<Value, std::string>) {
      text += '"';
      text += std::string(value);
      text += '"';
    } else if constexpr (std::is_pointer_v<Value>) {
      text = std::to_string(reinterpret_cast<intptr_t>(value));
    } else {
      text = std::to_string(static_cast<long long>(value));
    }
  }
  std::string text;
};

// The case fails, and goes on, unless both are equal. `row` names the row of a table.
void Expect(const Shown& actual, const Shown& expected, const std::string& row = "",
            std::source_location where = std::source_location::current());

// The same for calls, made from left to right: each has its own answer, or all have the one.
void ExpectEach(std::initializer_list<Shown> actual, std::initializer_list<Shown> expected,
                const std::string& row = "",
                std::source_location where = std::source_location::current());

// A file that exists, and one that is made or cut, to be read and written by nobody else.
HANDLE Open(const std::string& name, DWORD access, DWORD share = 0);
HANDLE Create(const std::string& name, DWORD attributes = FILE_ATTRIBUTE_NORMAL);
// Whether an open has worked; what it opened is closed again.
bool Opens(HANDLE file);
// What is read, or "failed"; whether all is written.
std::string Read(HANDLE file, DWORD count);
BOOL Write(HANDLE file, const std::string& bytes);

// A whole file; "failed" for one that can't be read.
void WriteText(const std::string& path, const std::string& bytes);
std::string ReadText(const std::string& path);

}  // namespace contract

// A case stands in the namespace.
#define CONTRACT(group, title)                                           \
  static void group##title();                                            \
  static const Case case##group##title(#group "." #title, group##title); \
  static void group##title()

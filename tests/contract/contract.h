// The contract of the system: what the program leans on at the edges of the functions of
// platform/win32.h. One source is run on the stand-in machine and under Wine, so that the stand-in
// can't answer otherwise than Windows does.
//
// A case runs in C:\contract, a fresh directory that holds this program, and below the fresh key
// kKey of HKEY_LOCAL_MACHINE. Cases don't lean on each other.
#pragma once

#include <concepts>
#include <source_location>
#include <string>
#include <type_traits>

#include "platform/win32.h"

namespace contract {

inline constexpr char kKey[] = "SOFTWARE\\Zeb\\Contract";

struct Case {
  Case(const char* caseName, void (*caseBody)());
  const char* name;
  void (*body)();
};

// Whether Wine answers, for the few places in which it is known to differ from Windows. Each says
// how.
bool IsWine();

// Both sides of a comparison as text; numbers are signed, as the C type of their width would have
// them, so that the worlds, whose types differ, compare alike.
template <typename Value>
std::string Shown(const Value& value) {
  if constexpr (std::is_null_pointer_v<Value>) {
    return "0";
  } else if constexpr (std::convertible_to<Value, std::string>) {
    return '"' + std::string(value) + '"';
  } else if constexpr (std::is_pointer_v<Value>) {
    return std::to_string(reinterpret_cast<intptr_t>(value));
  } else {
    return std::to_string(static_cast<long long>(value));
  }
}

void Compare(const std::string& actual, const std::string& expected, const std::string& row,
             std::source_location where);

// The case fails, and goes on, unless both are equal. `row` names the row of a table.
template <typename Actual, typename Expected>
void Expect(const Actual& actual, const Expected& expected, const std::string& row = "",
            std::source_location where = std::source_location::current()) {
  Compare(Shown(actual), Shown(expected), row, where);
}

// A file's bytes, written and read as one; "none" for a file that can't be opened.
void WriteText(const std::string& path, const std::string& bytes);
std::string ReadText(const std::string& path);

}  // namespace contract

#define CONTRACT(group, title)                                                     \
  static void group##title();                                                      \
  static const contract::Case case##group##title(#group "." #title, group##title); \
  static void group##title()

// The exit codes as docs/exit-codes.md promises them.
#pragma once

#include <cstdio>
#include <string>

#include "core/status.h"
#include "tests/support/test_machine.h"

// What the table's row has behind the three forms of the code: "NAME` | meaning | silent runs".
// Empty for a code that has no row, or not these forms.
inline std::string DocumentedCode(StatusCode code) {
  static const std::string document = FileBytes(MORIV_SOURCE_DIR "/docs/exit-codes.md");
  const auto bits = static_cast<unsigned>(code);
  char forms[60];
  std::snprintf(forms, sizeof(forms), "\n| %d | %u | 0x%08X | `", code, bits, bits);
  const size_t row = document.find(forms);
  if (row == std::string::npos) return "";
  const size_t start = document.find('`', row) + 1;
  return document.substr(start, document.find(" |\n", start) - start);
}

// A silent "Install" or "Removal" may end with it.
inline bool IsSilentEnd(StatusCode code, const std::string& work) {
  const std::string row = DocumentedCode(code);
  const std::string end = row.substr(row.rfind('|') + 1);
  return !end.starts_with(" Never") && end.find(work.substr(1)) != std::string::npos;
}

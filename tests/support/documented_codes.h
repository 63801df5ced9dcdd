// The exit codes as docs/exit-codes.md promises them.
#pragma once

#include <algorithm>
#include <fstream>
#include <regex>
#include <string>
#include <vector>

#include "core/status.h"

struct DocumentedCode {
  StatusCode code;
  std::string unsignedForm, hexadecimal, name;
  std::string givenBy;  // what is said of silent runs
};

inline std::vector<DocumentedCode> ReadDocumentedCodes() {
  static const std::regex row(
      R"(\| (-?\d+) \| (\d+) \| (0x[0-9A-F]{8}) \| `(Status\w+)` \| [^|]+ \| ([^|]+) \|)");
  std::vector<DocumentedCode> codes;
  std::ifstream document(MORIV_SOURCE_DIR "/docs/exit-codes.md");
  for (std::string line; std::getline(document, line);) {
    std::smatch cell;
    if (std::regex_match(line, cell, row))
      codes.push_back({std::stoi(cell[1]), cell[2], cell[3], cell[4], cell[5]});
  }
  return codes;
}

// A silent "install" or "removal" may end with it.
inline bool IsSilentEnd(StatusCode code, const std::string& work) {
  static const std::vector<DocumentedCode> codes = ReadDocumentedCodes();
  return std::ranges::any_of(codes, [&](const DocumentedCode& row) {
    const bool isNever = row.givenBy.starts_with("Never");
    return row.code == code && !isNever && row.givenBy.find(work.substr(1)) != std::string::npos;
  });
}

// Reads back the program's log.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

struct LogLine {
  char severity;  // 'i', 'w', 'f': information, warning, fatal
  std::string text;
};

// The events of a log of one block; nullopt when a byte of it is out of form.
std::optional<std::vector<LogLine>> ReadLog(std::string_view log);

#include "tests/faults/log_text.h"

#include <regex>

std::optional<std::vector<LogLine>> ReadLog(const std::string& log) {
  static const std::regex heading("\r\n\r\nInstalling Moriv : .* \r\n\r\n");
  static const std::regex event(
      "(\\d+)- (?:Fatal Error : (.*)\\. \r\n\r\n \\(Application will exit\\)|(?!Fatal "
      "Error)(.*))\r\n");
  constexpr auto kFromHere = std::regex_constants::match_continuous;
  std::vector<LogLine> lines;
  std::smatch match;
  if (!std::regex_search(log, match, heading, kFromHere)) return std::nullopt;
  for (auto rest = match.suffix().first; rest != log.end(); rest = match.suffix().first) {
    if (!std::regex_search(rest, log.end(), match, event, kFromHere) ||
        match[1] != std::to_string(lines.size() + 1)) {
      return std::nullopt;
    }
    const bool isFatal = match[2].matched;
    const std::string text = isFatal ? match[2] : match[3];
    lines.push_back({isFatal ? 'f' : text.ends_with(". (Warning)") ? 'w' : 'i', text});
  }
  return lines;
}

#include "tests/faults/log_text.h"

namespace {

constexpr std::string_view kHeading = "\r\n\r\nInstalling Moriv : ";
constexpr std::string_view kHeadingEnd = " \r\n\r\n";
constexpr std::string_view kFatal = "Fatal Error : ";
constexpr std::string_view kFatalEnd = ". \r\n\r\n (Application will exit)\r\n";
constexpr std::string_view kLineEnd = "\r\n";
constexpr std::string_view kWarningEnd = ". (Warning)";

// Takes the text up to `end`, and `end` itself, off the rest.
std::optional<std::string> TakeUpTo(std::string_view end, std::string_view* rest) {
  const size_t at = rest->find(end);
  if (at == std::string_view::npos) return std::nullopt;
  const std::string text(rest->substr(0, at));
  rest->remove_prefix(at + end.size());
  if (text.find_first_of(kLineEnd) != std::string::npos) return std::nullopt;
  return text;
}

bool Take(std::string_view start, std::string_view* rest) {
  if (!rest->starts_with(start)) return false;
  rest->remove_prefix(start.size());
  return true;
}

}  // namespace

std::optional<std::vector<LogLine>> ReadLog(std::string_view log) {
  if (!Take(kHeading, &log) || !TakeUpTo(kHeadingEnd, &log)) return std::nullopt;
  std::vector<LogLine> lines;
  while (!log.empty()) {
    if (!Take(std::to_string(lines.size() + 1) + "- ", &log)) return std::nullopt;
    const bool isFatal = Take(kFatal, &log);
    std::optional<std::string> text = TakeUpTo(isFatal ? kFatalEnd : kLineEnd, &log);
    if (!text) return std::nullopt;
    const bool isWarning = !isFatal && text->ends_with(kWarningEnd);
    lines.push_back({isFatal ? 'f' : isWarning ? 'w' : 'i', *text});
  }
  return lines;
}

#include "tools/image/run_explainer.h"

#include <algorithm>
#include <optional>
#include <stdexcept>
#include <string_view>
#include <vector>

#include "log/event_log.h"
#include "machine/code_page.h"
#include "tools/image/bad_input.h"
#include "tools/image/input_file.h"
#include "tools/image/run_outcomes.h"

namespace image {
namespace {

constexpr uint64_t kLogLimit = 64 << 20;  // bytes; a report file grows with each run
constexpr std::string_view kHeading = "Installing Moriv : ";
constexpr std::string_view kFatalMark = "Fatal Error : ";

struct LoggedEvent {
  uint32_t code = 0;
  bool isFatal = false;
  std::string line;  // as it stands in the log, without blanks at its end
};

struct LoggedRun {
  std::string time;
  std::vector<LoggedEvent> events;

  const LoggedEvent* Find(uint32_t code) const {
    for (const LoggedEvent& event : events) {
      if (event.code == code) return &event;
    }
    return nullptr;
  }
};

std::string Line(const std::string& label, const std::string& value) {
  return label + std::string(12 - label.size(), ' ') + value + '\n';
}

std::string_view TrimEnd(std::string_view text) {
  const size_t last = text.find_last_not_of(" \r");
  return text.substr(0, last == std::string_view::npos ? 0 : last + 1);
}

// The event whose text the line, behind its number, begins with: the longest one, should one text
// begin like another.
std::optional<uint32_t> FindEvent(std::string_view text) {
  std::optional<uint32_t> found;
  for (uint32_t code = 0; code <= EventSpaceNeeded; ++code) {
    const std::string_view known = EventText(code);
    if (!text.starts_with(known)) continue;
    if (!found || known.size() > std::string_view(EventText(*found)).size()) found = code;
  }
  return found;
}

// nullopt for a line that is no event's, such as what stands under a fatal one.
std::optional<LoggedEvent> ReadEvent(std::string_view line) {
  const size_t digits = line.find_first_not_of("0123456789");
  if (digits == 0 || digits == std::string_view::npos) return std::nullopt;
  std::string_view text = line.substr(digits);
  if (!text.starts_with("- ")) return std::nullopt;
  text.remove_prefix(2);
  LoggedEvent event;
  event.isFatal = text.starts_with(kFatalMark);
  if (event.isFatal) text.remove_prefix(kFatalMark.size());
  const std::optional<uint32_t> code = FindEvent(text);
  if (!code) return std::nullopt;
  event.code = *code;
  event.line = machine::ToUtf8(TrimEnd(line));
  return event;
}

// The last run of the log; nullopt when it has none.
std::optional<LoggedRun> ReadLastRun(std::string_view log) {
  std::optional<LoggedRun> run;
  while (!log.empty()) {
    const size_t end = std::min(log.find('\n'), log.size());
    const std::string_view line = log.substr(0, end);
    log.remove_prefix(std::min(end + 1, log.size()));
    if (line.starts_with(kHeading)) {
      run = LoggedRun{machine::ToUtf8(TrimEnd(line.substr(kHeading.size()))), {}};
    } else if (run) {
      if (std::optional<LoggedEvent> event = ReadEvent(line)) {
        run->events.push_back(std::move(*event));
      }
    }
  }
  return run;
}

std::string DescribeOutcome(const RunOutcome& outcome) {
  char hexadecimal[16] = {};
  const auto bits = static_cast<uint32_t>(outcome.code);
  (void)FormatText(hexadecimal, sizeof(hexadecimal), "0x%08X", bits);
  std::string numbers = std::to_string(outcome.code);
  if (outcome.code < 0) numbers += " = " + std::to_string(bits);
  numbers += std::string(" = ") + hexadecimal;
  if (*outcome.name != '\0') numbers += std::string(", ") + outcome.name;
  return Line("exit code", numbers) + Line("meaning", outcome.meaning) +
         Line("to do", outcome.remedy);
}

std::string DescribeDecision(const LoggedEvent& event, std::span<const StatusCode> codes) {
  std::string text = Line("event", event.line);
  for (const StatusCode code : codes) text += DescribeOutcome(*FindRunOutcome(code));
  return text;
}

// The event that decides the end of a run without a fatal one, and the exit code of a silent run.
// The first that stands in the log counts.
struct ClosingEvent {
  uint32_t event;
  StatusCode code;
};
constexpr ClosingEvent kClosingEvents[] = {
    {EventRemovalProgramFailed, StatusRemovalProgramFailed},
    {EventNotRegistered, StatusNotRegistered},
    {EventUnregistered, StatusOk},
    {EventRemovalProgramWritten, StatusOk},
    {EventSpaceNeeded, 0},
};

std::string DescribeEnd(const LoggedRun& run) {
  for (const LoggedEvent& event : run.events) {
    if (event.isFatal) return DescribeDecision(event, CodesOfFatalEvent(event.code));
  }
  for (const auto& [closing, code] : kClosingEvents) {
    if (const LoggedEvent* event = run.Find(closing)) return DescribeDecision(*event, {&code, 1});
  }
  // The two ends that add no event.
  std::string text = Line("event", "none that tells how the run ended");
  for (const StatusCode code : {StatusInternal, StatusCancelled}) {
    text += DescribeOutcome(*FindRunOutcome(code));
  }
  return text;
}

std::optional<LoggedRun> ReadLastRunOf(const std::filesystem::path& log) {
  const std::vector<uint8_t> bytes = ReadWholeFile(log, kLogLimit);
  return ReadLastRun({reinterpret_cast<const char*>(bytes.data()), bytes.size()});
}

}  // namespace

std::string ExplainExitCode(StatusCode code) {
  const RunOutcome* outcome = FindRunOutcome(code);
  if (outcome == nullptr) {
    throw std::runtime_error(std::to_string(code) + " is no exit code of the setup program");
  }
  return DescribeOutcome(*outcome);
}

std::string ExplainLog(const std::filesystem::path& log) {
  const std::optional<LoggedRun> run = ReadLastRunOf(log);
  if (!run)
    throw BadInput(
        log, "no log of the setup program: no line begins with \"" + std::string(kHeading) + "\"");
  return Line("run", run->time) + DescribeEnd(*run);
}

std::vector<std::string> ReadEventLines(const std::filesystem::path& log) {
  std::vector<std::string> lines;
  if (const std::optional<LoggedRun> run = ReadLastRunOf(log)) {
    for (const LoggedEvent& event : run->events) lines.push_back(event.line);
  }
  return lines;
}

std::string DecidingEvent(const std::filesystem::path& log, StatusCode code) {
  const std::optional<LoggedRun> run = ReadLastRunOf(log);
  if (!run) return {};
  for (const LoggedEvent& event : run->events) {
    if (event.isFatal) return event.line;
  }
  for (const ClosingEvent& closing : kClosingEvents) {
    const LoggedEvent* const event = run->Find(closing.event);
    if (closing.code == code && event != nullptr) return event->line;
  }
  return {};
}

}  // namespace image

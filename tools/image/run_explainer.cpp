#include "tools/image/run_explainer.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string_view>

#include "log/event_log.h"
#include "machine/code_page.h"
#include "tools/terminal/printable_text.h"

namespace image {
namespace {

constexpr std::string_view kHeading = "Installing Moriv : ";
constexpr std::string_view kFatalMark = "Fatal Error : ";
constexpr std::string_view kFatalEnd = " (Application will exit)";  // a line of its own

struct LoggedEvent {
  uint32_t code = 0;
  bool isFatal = false;
  std::string line;  // as it stands in the log, without blanks at its end
};

struct LoggedRun {
  std::string time;
  std::vector<LoggedEvent> events;
  bool isCutShort = false;  // what the program writes at the end isn't there

  const LoggedEvent* Find(uint32_t code) const {
    for (const LoggedEvent& event : events) {
      if (event.code == code) return &event;
    }
    return nullptr;
  }
};

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
  bool isLineWhole = true;
  bool isFatalEnded = false;
  while (!log.empty()) {
    const size_t end = std::min(log.find('\n'), log.size());
    const std::string_view line = log.substr(0, end);
    isLineWhole = end < log.size();
    log.remove_prefix(std::min(end + 1, log.size()));
    if (line.starts_with(kHeading)) {
      run = LoggedRun{machine::ToUtf8(TrimEnd(line.substr(kHeading.size()))), {}, false};
      isFatalEnded = false;
    } else if (run) {
      isFatalEnded |= TrimEnd(line) == kFatalEnd;
      if (std::optional<LoggedEvent> event = ReadEvent(line)) {
        run->events.push_back(std::move(*event));
      }
    }
  }
  if (run) {
    const bool isFatal = !run->events.empty() && run->events.back().isFatal;
    run->isCutShort = !isLineWhole || run->events.empty() || isFatal != isFatalEnded;
  }
  return run;
}

// What is no log, "" for what may be one. The program writes 8-bit text.
std::string FindLogFault(std::string_view bytes) {
  if (bytes.starts_with("MZ") || bytes.starts_with("\x7F"
                                                   "ELF")) {
    return "is a program, not its log; for a setup image see list and verify";
  }
  const std::string_view front = bytes.substr(0, 256);
  const bool hasMark = front.starts_with("\xFF\xFE") || front.starts_with("\xFE\xFF");
  if (hasMark || std::ranges::count(front, '\0') * 3 > std::ssize(front)) {
    return "is a text in UTF-16, which the setup program never writes; take the log itself, not "
           "what a console or an editor made of it";
  }
  return "";
}

std::string Hexadecimal(StatusCode code) {
  char text[16] = {};
  (void)FormatText(text, sizeof(text), "0x%08X", static_cast<uint32_t>(code));
  return text;
}

bool IsForeign(const RunOutcome& outcome) {
  return FindRunOutcome(outcome.code) == nullptr;
}

std::string DescribeOutcome(const RunOutcome& outcome) {
  std::string numbers = std::to_string(outcome.code);
  if (outcome.code < 0) numbers += " = " + std::to_string(static_cast<uint32_t>(outcome.code));
  numbers += " = " + Hexadecimal(outcome.code);
  if (*outcome.name != '\0') numbers += std::string(", ") + outcome.name;
  return ReportLine("exit code",
                    numbers + (IsForeign(outcome) ? ", not the setup program's" : "")) +
         ReportLine("meaning", outcome.meaning) + ReportLine("to do", outcome.remedy);
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

void Decide(const LoggedEvent& event, std::span<const StatusCode> codes,
            RunExplanation* explanation) {
  explanation->event = event.line;
  for (const StatusCode code : codes) explanation->outcomes.push_back(*FindRunOutcome(code));
}

void ExplainEnd(const LoggedRun& run, RunExplanation* explanation) {
  for (const LoggedEvent& event : run.events) {
    if (event.isFatal) return Decide(event, CodesOfFatalEvent(event.code), explanation);
  }
  for (const auto& [closing, code] : kClosingEvents) {
    if (const LoggedEvent* event = run.Find(closing))
      return Decide(*event, {&code, 1}, explanation);
  }
  explanation->event = "";
  if (run.isCutShort) return;
  // The two ends that add no event.
  for (const StatusCode code : {StatusInternal, StatusCancelled}) {
    explanation->outcomes.push_back(*FindRunOutcome(code));
  }
}

std::string_view CharactersOf(std::span<const uint8_t> bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

}  // namespace

RunExplanation ExplainExitCode(StatusCode code) {
  const RunOutcome* outcome = FindRunOutcome(code);
  if (outcome == nullptr) outcome = FindForeignOutcome(code);
  if (outcome == nullptr) {
    throw std::runtime_error(std::to_string(code) + " is no exit code of the setup program");
  }
  return {{}, {}, false, {*outcome}};
}

RunExplanation ExplainLog(std::span<const uint8_t> bytes) {
  const std::string_view text = CharactersOf(bytes);
  const std::string fault = FindLogFault(text);
  if (!fault.empty()) throw std::runtime_error(fault);
  const std::optional<LoggedRun> run = ReadLastRun(text);
  if (!run) {
    throw std::runtime_error("no log of the setup program: no line begins with \"" +
                             std::string(kHeading) + "\"");
  }
  RunExplanation explanation;
  explanation.time = run->time;
  explanation.isCutShort = run->isCutShort;
  ExplainEnd(*run, &explanation);
  return explanation;
}

std::string ReportLine(const std::string& label, const std::string& value) {
  return label + std::string(12 - label.size(), ' ') + value + '\n';
}

std::string Describe(const RunExplanation& explanation) {
  std::string text;
  if (explanation.time) text += ReportLine("run", terminal::Printable(*explanation.time));
  if (explanation.isCutShort) {
    text += ReportLine("log", "cut short: this is what it tells up to there");
  }
  if (explanation.event) {
    text +=
        ReportLine("event", explanation.event->empty() ? "none that tells how the run ended"
                                                       : terminal::Printable(*explanation.event));
  }
  for (const RunOutcome& outcome : explanation.outcomes) text += DescribeOutcome(outcome);
  return text;
}

Json AsJson(const RunExplanation& explanation) {
  Json object = Json::object();
  if (explanation.time) {
    object["run"] = *explanation.time;
    object["isCutShort"] = explanation.isCutShort;
    object["event"] = *explanation.event;
  }
  object["outcomes"] = Json::array();
  for (const RunOutcome& outcome : explanation.outcomes) {
    object["outcomes"].push_back({{"exitCode", outcome.code},
                                  {"hexadecimal", Hexadecimal(outcome.code)},
                                  {"name", outcome.name},
                                  {"isForeign", IsForeign(outcome)},
                                  {"meaning", outcome.meaning},
                                  {"remedy", outcome.remedy}});
  }
  return object;
}

std::vector<std::string> ReadEventLines(std::span<const uint8_t> log) {
  std::vector<std::string> lines;
  if (const std::optional<LoggedRun> run = ReadLastRun(CharactersOf(log))) {
    for (const LoggedEvent& event : run->events) lines.push_back(event.line);
  }
  return lines;
}

std::string DecidingEvent(std::span<const uint8_t> log, StatusCode code) {
  const std::optional<LoggedRun> run = ReadLastRun(CharactersOf(log));
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

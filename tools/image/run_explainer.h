// Says in words how a run of the setup program ended, by its exit code or by its log.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "core/status.h"
#include "tools/image/json_output.h"
#include "tools/image/run_outcomes.h"

namespace image {

struct RunExplanation {
  // Of a log alone:
  std::optional<std::string> time;   // of its last run
  std::optional<std::string> event;  // that decided how the run ended, UTF-8; "": none did
  bool isCutShort = false;           // the log has no end
  // What a silent run ends with then; for some events one of several.
  std::vector<RunOutcome> outcomes;
};

// Throws std::runtime_error for a number that no run ends with and nobody answers in its place.
RunExplanation ExplainExitCode(StatusCode code);

// Of a log or a report file: its last run. Throws std::runtime_error for what is none.
//   bytes  all of it
RunExplanation ExplainLog(std::span<const uint8_t> bytes);

// A line of a report for people: what it tells of, in 12 columns, and that.
std::string ReportLine(const std::string& label, const std::string& value);

// For people, one line for each thing.
std::string Describe(const RunExplanation& explanation);
Json AsJson(const RunExplanation& explanation);

// The lines of the events of its last run, without blanks at their ends.
std::vector<std::string> ReadEventLines(std::span<const uint8_t> log);

// The line of the event that decided how the last run of a log ended, which it did with `code`; ""
// when none tells it.
std::string DecidingEvent(std::span<const uint8_t> log, StatusCode code);

}  // namespace image

// Says in words how a run of the setup program ended, by its exit code or by its log.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "core/status.h"

namespace image {

// Throws std::runtime_error for a number that no run ends with.
std::string ExplainExitCode(StatusCode code);

// Of a log or a report file: its last run, the event that decided how it ended, and for each exit
// code that a silent run gives then, what it means and what to do. Throws BadInput for a file that
// can't be read or has no run in it.
std::string ExplainLog(const std::filesystem::path& log);

// The lines of the events of its last run, without blanks at their ends.
std::vector<std::string> ReadEventLines(const std::filesystem::path& log);

// The line of the event that decided how the last run of a log ended, which it did with `code`; ""
// when none tells it.
std::string DecidingEvent(const std::filesystem::path& log, StatusCode code);

}  // namespace image

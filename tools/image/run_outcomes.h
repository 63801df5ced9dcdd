// What a run's exit code means to the one who ran it, and what a run's log says of its exit code.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

#include "core/status.h"

namespace image {

struct RunOutcome {
  StatusCode code;
  const char* name;     // as in core/status.h; empty for 0, which is no status
  const char* meaning;  // sentences, as all texts here
  const char* remedy;   // what to do
};

// All of them, success first.
std::span<const RunOutcome> RunOutcomes();

// Null for a number that no run ends with.
const RunOutcome* FindRunOutcome(StatusCode code);

// What Windows or a fleet tool gives for an exit code when the program didn't run, or isn't done.
// Null for any other number.
const RunOutcome* FindForeignOutcome(StatusCode code);

// An exit code as tools show it: decimal, signed or as the same 32 bits unsigned, or with 0x in
// front in hexadecimal. nullopt for a text that is no such number.
std::optional<StatusCode> ParseExitCode(std::string_view text);

// Exit codes of the silent runs whose log has this fatal event. Empty for an event that is never
// fatal.
std::span<const StatusCode> CodesOfFatalEvent(uint32_t event);

}  // namespace image

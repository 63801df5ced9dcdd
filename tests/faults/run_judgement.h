// What a run with a fault in it may leave behind, and what not.
#pragma once

#include <string>
#include <vector>

#include "tests/faults/faulty_run.h"

// A run that has met its fault.
struct FaultyRun {
  const RunKind& kind;
  const Injection& injection;
  const RunReport& report;
  const MachineState& before;
  const MachineState& whole;  // what a run without a fault makes of `before`
  const MachineState& after;
  const std::filesystem::path& folder;  // where `after` stands
};

inline bool EndedWell(int code) {
  return code >= 0;
}

// What is wrong, one text each. On the machine each thing is what it was, what an undisturbed run
// makes of it, or gone, and after a power loss a file may be a beginning; what such a run leaves
// alone is untouched.
std::vector<std::string> JudgeRun(const FaultyRun& run);

// The same of a second run, without a fault, that found what the first one left and has made
// `after` of it: it ends well, and makes what an undisturbed run makes.
std::vector<std::string> JudgeSecondRun(const FaultyRun& first, const RunReport& second,
                                        const MachineState& after);

// The exit codes that a silent run has, as moriv-image explains them.
#pragma once

#include <algorithm>

#include "core/event_list.h"
#include "tools/image/run_outcomes.h"

// Whether the event, fatal or a warning, tells why a run ends with the code.
inline bool IsReasonFor(StatusCode code, uint32_t event) {
  if (code == StatusRemovalProgramFailed) return event == EventRemovalProgramFailed;
  if (code == StatusNotRegistered) return event == EventNotRegistered;
  return std::ranges::count(image::CodesOfFatalEvent(event), code) != 0;
}

inline bool IsSilentExitCode(StatusCode code) {
  for (uint32_t event = 0; event <= EventSpaceNeeded; ++event) {
    if (IsReasonFor(code, event)) return true;
  }
  return code == StatusOk;
}

// Finds out what a silent run would do: lets the program's own code run on a copy of a machine, and
// compares.
#pragma once

#include <filesystem>
#include <optional>
#include <string>

#include "tools/planner/run_plan.h"

namespace image {

struct PlanOrder {
  std::filesystem::path image;
  std::optional<std::filesystem::path> machine;  // else a fresh one
  std::string directory;                         // empty: none is asked for
  bool remove = false;
  std::string options;  // more of them, as they stand on the run's command line
};

// `folder` is new and empty, and is where all is done. To be called in a process of its own, once:
// the machine is this process's, and the program keeps what the system has told it. Throws a
// std::exception for an image or a machine that can't be taken, and for options that don't leave
// the run silent.
RunPlan PlanRun(const PlanOrder& order, const std::filesystem::path& folder);

}  // namespace image

// What the program settles before it works, and where its files would go: its own functions are
// asked on the machine as it stands, and nothing is changed.
#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

#include "tools/planner/run_plan.h"

namespace image {

struct RunSurvey {
  // Code page bytes, as the program has them: of each of the plan's places, and of the directories
  // that a removal tries to take away.
  std::vector<std::string> placePaths;
  std::set<std::string> directories;
  std::string removalProgram, log;  // empty when the program finds none
  std::map<char, uint64_t> freeBytes;
};

// Of the run that the machine's command line asks for. Fills the parts of `plan` that it says.
RunSurvey SurveyRun(RunPlan* plan);

}  // namespace image

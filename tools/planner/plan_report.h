// A plan for people and for programs.
#pragma once

#include <string>

#include "tools/image/json_output.h"
#include "tools/planner/run_plan.h"

namespace image {

// Sections of lines, in UTF-8; what there is nothing of is left out.
std::string ShowPlan(const RunPlan& plan);

// One object; docs/image-tool.md has its keys.
Json PlanAsJson(const RunPlan& plan);

}  // namespace image

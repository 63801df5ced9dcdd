// The drives of a stand-in machine as a list of DOS paths.
#pragma once

#include <filesystem>
#include <string>

namespace machine_tool {

// One line for each drive, folder and file of the machine in `folder`: attributes (A archive, R
// read-only), size or <DIR>, path; sorted by path without regard to case. Links are shown, not
// followed.
std::string ShowDrives(const std::filesystem::path& folder);

}  // namespace machine_tool

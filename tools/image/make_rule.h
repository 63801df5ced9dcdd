// A rule for make, as compilers write them.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace image {

// "TARGET: INPUT INPUT...", a line for each, with make's own characters in paths escaped. Paths are
// written as they are given, with / between folders.
std::string MakeRule(const std::filesystem::path& target,
                     const std::vector<std::filesystem::path>& inputs);

}  // namespace image

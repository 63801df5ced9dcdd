// How deep a TOML text nests, told before anyone parses it: a parser goes down a level for each,
// and so does whoever frees what it has read.
#pragma once

#include <optional>
#include <string_view>

namespace image {

inline constexpr int kDeepestNesting = 16;

// The first line, from 1, with more than that many brackets and braces open or points in one key;
// nullopt for a text without one, whether it is good TOML or not.
std::optional<int> FindDeepLine(std::string_view toml);

}  // namespace image

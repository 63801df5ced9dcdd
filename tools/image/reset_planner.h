// Finds where the table is best emptied before it is full.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <span>
#include <vector>

namespace image {

// The positions behind which the table is to be emptied, ascending, and the file's size as the last
// one. No stream of the same phrases with its resets at other candidates is shorter, and candidates
// are the places where a full table would be emptied too.
//
//   looksAhead  as PhraseParser's
//   progress   called with the bytes of the file that were planned since the last call
std::vector<size_t> PlanResets(std::span<const uint8_t> file, bool looksAhead,
                               const std::function<void(size_t)>& progress);

}  // namespace image

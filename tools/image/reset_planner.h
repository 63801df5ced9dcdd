// Finds where the table is best emptied before it is full.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <span>
#include <vector>

namespace image {

// The positions at which the table is to be emptied, ascending, and the file's size as the last
// one. They are chosen among candidates, to which belong the places where a table that is emptied
// only when it is full would be; no other choice makes a shorter stream.
//
//   looksAhead  as PhraseParser's
//   progress    called with the bytes of the file that were planned since the last call
std::vector<size_t> PlanResets(std::span<const uint8_t> file, bool looksAhead,
                               const std::function<void(size_t)>& progress);

}  // namespace image

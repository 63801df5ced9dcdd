// Finds where the table is best emptied before it is full, and what is best left to literals.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <span>
#include <vector>

namespace image {

// What lies between two resets.
struct Life {
  size_t end;        // position in the file
  bool areLiterals;  // each byte is a code of its own, in the first width
};

// The lives that a file is to be written in, which end where the table is full or earlier.
//
//   candidates  positions at which a life may begin, ascending, without the file's size
//   progress    called with the bytes of the file that were planned since the last call
std::vector<Life> PlanLives(std::span<const uint8_t> file, std::vector<size_t> candidates,
                            const std::function<void(size_t)>& progress);

}  // namespace image

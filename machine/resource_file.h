// Resources one after the other, as a resource compiler writes them into a .res file.
#pragma once

#include <cstdint>
#include <optional>
#include <span>

namespace machine {

// The data of the entry with these numbers, a language-neutral one first; it lies in `file`.
// nullopt when there is none, or damage stands in front of it.
std::optional<std::span<const uint8_t>> FindInResourceFile(std::span<const uint8_t> file, int type,
                                                           int id);

}  // namespace machine

// Resources that the running native program carries.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace machine {

// A resource by numbers in the .res bytes that this program carries: type (6 strings, 14 icon
// group, 16 version ...), id. Language-neutral entries first. nullopt when there is none.
std::optional<std::vector<uint8_t>> OwnResource(int type, int id);

}  // namespace machine

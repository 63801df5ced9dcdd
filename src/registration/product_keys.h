// Key paths of the product's registry tree, as the library's two halves build them.
#pragma once

#include <cstddef>
#include <cstdint>

// At most 127 characters.
inline constexpr size_t kProductPathSize = 128;
using ProductPath = char[kProductPathSize];

// Builds the path of the root (null service), of a service (null subKey) or of a service's sub-key.
// False for a bad service name, a bad kind with a subKey, or a path of more than 127 characters.
bool BuildProductPath(const char* service, int32_t kind, const char* subKey, ProductPath& path);

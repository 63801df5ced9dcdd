// Key paths of the product's registry tree, as the library's two halves build them.
#pragma once

#include <cstddef>
#include <cstdint>

#include "platform/registry_key.h"

inline constexpr char kSoftwareKey[] = "SOFTWARE";
inline constexpr char kMakerKey[] = "SOFTWARE\\Zeb";
inline constexpr char kRootKey[] = "SOFTWARE\\Zeb\\Moriv";
inline constexpr char kServicesKey[] = "SOFTWARE\\Zeb\\Moriv\\Services";

// At most 127 characters.
inline constexpr size_t kProductPathSize = 128;
using ProductPath = char[kProductPathSize];

bool IsServiceName(const char* service);  // 3 to 63 characters
bool IsSubKeyKind(int32_t kind);

// The name of a kind's key under a service. The kind must be one.
const char* SubKeyFolder(int32_t kind);

// Builds the path of the root (null service), of a service (null subKey) or of a service's sub-key.
// False for a bad service name, a bad kind with a subKey, or a path of more than 127 characters.
bool BuildProductPath(const char* service, int32_t kind, const char* subKey, ProductPath& path);

// Whole files of the host.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <vector>

namespace machine {

// The bytes of a regular file; nullopt when it is none or can't be read.
std::optional<std::vector<uint8_t>> ReadHostFile(const std::filesystem::path& file);

}  // namespace machine

// The removal program, made without an install.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>

namespace image {

// Writes the removal program that an install from a setup image writes.
//   language  the language of that install; without one the image's default language stays
// Throws BadInput, with no output left, for an image that no install could make one of.
void WriteRemovalImage(const std::filesystem::path& image, const std::filesystem::path& output,
                       std::optional<int32_t> language);

}  // namespace image

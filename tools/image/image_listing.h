// What an image holds, as a table for people.
#pragma once

#include <filesystem>
#include <string>

namespace image {

// Header fields, then one line for each record, in UTF-8. Throws BadInput for a damaged image.
std::string ListImage(const std::filesystem::path& image);

}  // namespace image

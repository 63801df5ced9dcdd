// What an image holds, for people and for programs.
#pragma once

#include <filesystem>
#include <string>

#include "tools/image/json_output.h"

namespace image {

// Header fields, then one line for each record, in UTF-8. Throws BadInput for a damaged image.
std::string ListImage(const std::filesystem::path& image);

// The same as an object with a list of records.
Json ListImageAsJson(const std::filesystem::path& image);

}  // namespace image

// Checks all of an image that the setup program takes on trust.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace image {

struct Finding {
  bool isGood = false;
  std::string text;  // one line, UTF-8
};

// One finding for each part that is as it should be and one for each thing that is not. Throws
// BadInput only when the file can't be read at all.
std::vector<Finding> VerifyImage(const std::filesystem::path& image);

}  // namespace image

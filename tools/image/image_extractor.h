// Expands the files of an image into a folder of the host.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace image {

struct ExtractOrder {
  std::filesystem::path image;
  std::filesystem::path folder;    // made when missing; its parent must be there
  std::vector<std::string> names;  // UTF-8, case does not count; none: every file
  bool replaceExisting = false;
};

// Returns the paths written, each `folder` and a bare file name. Throws BadInput, with nothing
// written, for a damaged image, a name that could lead elsewhere or is not in the package, a file
// that exists, and two different files of one name.
std::vector<std::filesystem::path> ExtractImage(const ExtractOrder& order);

}  // namespace image

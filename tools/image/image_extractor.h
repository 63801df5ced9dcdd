// Expands the files of an image into a folder of the host.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace image {

struct ExtractOrder {
  std::filesystem::path image;
  std::filesystem::path folder;  // made when missing; its parent must be there
  // "#2" is the second record, anything else a name in UTF-8, whose case does not count; none:
  // every file.
  std::vector<std::string> names;
  bool isTree = false;  // each file in folders that tell its first place
  bool replaceExisting = false;
};

// Returns the paths written, below `folder`. Throws BadInput, with all as it was, for a damaged
// image, a name or a place that could lead elsewhere, a name that is not in the package, too little
// space, a file that exists, and two different files for one path.
std::vector<std::filesystem::path> ExtractImage(const ExtractOrder& order);

}  // namespace image

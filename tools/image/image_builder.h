// Makes images: the setup program without a package, and behind it the package.
#pragma once

#include <filesystem>

namespace image {

struct PackOrder {
  std::filesystem::path description;  // TOML file
  std::filesystem::path stub;         // setup program without a package
  std::filesystem::path output;
  std::filesystem::path sourceFolder;  // "": the folder of the description
  bool allowUnknownMacros = false;
  bool best = false;  // the smallest image, at many times the time
};

// Writes an image that is a function of the bytes of the description, the stub and the sources.
// Throws BadInput, with no output left, when the stub is unfit or when any text or size is one that
// the setup program does not check and could not stand.
void PackImage(const PackOrder& order);

}  // namespace image

// Makes images: the setup program without a package, and behind it the package.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace image {

struct PackOrder {
  std::filesystem::path description;  // TOML file
  std::filesystem::path stub;         // setup program without a package
  std::filesystem::path output;
  std::filesystem::path sourceFolder;  // "": the folder of the description
  std::filesystem::path makeRule;      // file to write a rule for make into; "" for none
  bool allowUnknownMacros = false;
  bool best = false;  // the smallest image, at many times the time
};

struct PackReport {
  struct File {
    std::string name, destination;  // code page bytes
    uint64_t size = 0;
    uint64_t stored = 0;  // of its stream
  };
  std::vector<File> files;  // in package order
  uint64_t imageSize = 0;
  std::vector<std::string> warnings;  // each a line, with file, line and key
};

// Writes an image that is a function of the bytes of the description, the stub and the sources.
// Throws BadInputs or BadInput, with no output left, when the stub is unfit, when an output is one
// of the inputs, and when any text or size is one that the setup program does not check and could
// not stand.
PackReport PackImage(const PackOrder& order);

}  // namespace image

// Version and language of a file, as the setup program reads them of the files that it compares.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

#include "package/package_format.h"

namespace image {

struct VersionData {
  std::string language;  // 8 lower-case hexadecimal digits, "" when the file has no translation
  int16_t fields[3] = {kVersionNotSet, kVersionNotSet, kVersionNotSet};
  std::string text;  // of the file's version, that the fields are read from; code page bytes

  // What the setup program asks of its own image before it writes a removal program.
  bool IsComplete() const;
};

// Of a file without a version resource: no language and no field set. Throws BadInput when the file
// can't be read.
VersionData ReadVersionData(const std::filesystem::path& file);

// Three numbers of 0 to 32767 between points, and nothing else; false, with the fields unchanged,
// for any other text.
bool ParseVersion(std::string_view text, int16_t (&fields)[3]);

// The version as a reader of its text would tell it, "3.44.6" of "3, 44, 6, 2", when the setup
// program takes another from it; nullopt when it takes the same, or the file has none.
std::optional<std::string> FindMisreadVersion(const VersionData& version);

// "4.1.7"
std::string DescribeVersion(const int16_t (&fields)[3]);

}  // namespace image

// Version and language of a file, as the setup program reads them of the files that it compares.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

#include "package/package_format.h"

namespace image {

struct VersionData {
  std::string language;  // 8 lower-case hexadecimal digits, "" when the file has no translation
  int16_t fields[3] = {kVersionNotSet, kVersionNotSet, kVersionNotSet};

  // What the setup program asks of its own image before it writes a removal program.
  bool IsComplete() const;
};

// Of a file without a version resource: no language and no field set. Throws BadInput when the file
// can't be read.
VersionData ReadVersionData(const std::filesystem::path& file);

// Numbers of a version text like "4.1.7"; none is set for an empty text.
void ParseVersion(const std::string& text, int16_t (&fields)[3]);

}  // namespace image

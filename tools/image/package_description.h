// The TOML file that says what an image is made of.
//
//   [package]                                  everything in it has a default
//   default_directory = 'C:\Folder'            "": the setup program's own choice
//   default_language = "french"                or its offset; "none"
//   space_needed = 241664                      the sum of the files' sizes
//   removal = false                            true: a removal program, which holds no streams
//
//   [[file]]                                   one for each file, in package order
//   source = "program.exe"                     the only keys without a default are this one
//   destination = '%INSTALL_DIR%'              and this one
//   name = "program.exe"                       the source's own file name
//   version = "4.1.7"                          of the file's version resource
//   language = "040c04b0"                      of the file's version resource
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "tools/image/language_names.h"

namespace image {

// A value and the line that gives it, for messages. `text` is code page bytes.
struct DescribedText {
  std::string text;
  int line = 0;
};

struct FileDescription {
  std::filesystem::path source;  // as written
  int sourceLine = 0;
  DescribedText name;
  DescribedText destination;
  std::optional<DescribedText> version;
  std::optional<DescribedText> language;
};

struct PackageDescription {
  std::filesystem::path file;  // the TOML file itself
  DescribedText defaultDirectory;
  int32_t defaultLanguage = kNoLanguage;
  std::optional<uint32_t> spaceNeeded;
  bool isRemoval = false;
  std::vector<FileDescription> files;
};

// Throws BadInput with file, line and key for TOML that is none, an unknown key, a value out of its
// form and a text that the code page can't tell. What the texts may say is checked by who uses
// them.
PackageDescription ReadDescription(const std::filesystem::path& file);

}  // namespace image

// The TOML file that says what an image is made of.
//
//   [package]                                  everything in it has a default
//   default_directory = 'C:\Folder'            "": the setup program's own choice
//   default_language = "french"                or its offset; "none"
//   space_needed = 241664                      the files' sizes, times their certain places
//   removal = false                            true: a removal program, which holds no streams
//
//   [[file]]                                   one for each file, in package order
//   source = "program.exe"                     the only keys without a default are this one
//   destination = '%INSTALL_DIR%'              and this one, which may be a list of elements
//   name = "program.exe"                       the source's own file name
//   version = "4.1.7"                          of the file's version resource
//   language = "040c04b0"                      of the file's version resource
//
// A source with * or ? stands for all files that match, and has no name. A folder with all below
// it:
//
//   [[tree]]                                   its place among the files is that in the text
//   source = "data"
//   destination = '%INSTALL_DIR%\data'         each element goes on with the file's folder in
//   `data`
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "tools/image/fault_list.h"
#include "tools/image/language_names.h"

namespace image {

// A value and the line that gives it, for messages. `text` is code page bytes.
struct DescribedText {
  std::string text;
  int line = 0;
};

// One file: of a pattern or a folder there is one for each that it stands for.
struct FileDescription {
  std::filesystem::path source;  // from the folder of the sources, unless it begins at a root
  int sourceLine = 0;
  DescribedText name;
  DescribedText destination;
  std::optional<DescribedText> version;
  std::optional<DescribedText> language;
};

inline constexpr size_t kMostFiles = 0xFFFF;  // that a package can have

struct PackageDescription {
  std::filesystem::path file;  // the TOML file itself
  std::filesystem::path sourceFolder;
  DescribedText defaultDirectory;
  int32_t defaultLanguage = kNoLanguage;
  std::optional<uint32_t> spaceNeeded;
  bool isRemoval = false;
  std::vector<FileDescription> files;

  std::filesystem::path SourceOf(const FileDescription& described) const {
    return sourceFolder / described.source;
  }
};

// Reads a description and looks for the files that its patterns and folders stand for.
//   sourceFolder  of the sources; "" for the folder that the description is in
//   faults        gets, with line and key, each unknown key, each value out of its form, each text
//   that
//                 the code page can't tell and each pattern without a file; what has a fault is
//                 left out
// Throws BadInput for a file that can't be read or is no TOML. What the texts may say, and whether
// the sources are there, is checked by who uses them.
PackageDescription ReadDescription(const std::filesystem::path& file,
                                   const std::filesystem::path& sourceFolder, FaultList* faults);

// The same; throws BadInputs for faults.
PackageDescription ReadDescription(const std::filesystem::path& file,
                                   const std::filesystem::path& sourceFolder = {});

}  // namespace image

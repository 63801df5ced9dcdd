// The places of a packaged file: in the setup program's own words, and as folders of the host.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "package/package_format.h"

namespace image {

struct FilePlace {
  std::string key;         // equal for equal places, whatever their spelling
  std::string text;        // UTF-8, as %SYS_DIR%\moriv\b.dll
  bool isCertain = false;  // on every machine: a browser's plug-in directory is not
};

// One for each place that the file can go to, the first one first.
std::vector<FilePlace> PlacesOf(const FileRecord& record);

// Where `extract` puts the file, below the folder of its output: by its bare name...
std::filesystem::path FlatPlace(const FileRecord& record);
// ...or in folders for the first element of its destination: INSTALL_DIR, REMOVE_DIR, SYS_DIR,
// PLUGIN_..._DIR or a drive's letter, and below it the element's own folders. The record is to have
// no fault in name or destination.
std::filesystem::path TreePlace(const FileRecord& record);

}  // namespace image

// The files that a description names without naming each: by a pattern, or by the folder that they
// lie in or below.
//
// All texts are UTF-8, with / between folders and relative to the folder of the sources. What is
// found stands in the order of its bytes, on every host. A point at the beginning of a name is a
// character like others. A link stands for the plain file that it leads to, if that lies in the
// folder that the search began in; folders are not entered through links.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace image {

// Whether a source is a pattern: * stands for any characters of a name, ? for one.
bool IsPattern(std::string_view source);

// Both throw BadInput for a folder that can't be read, for a link that is not taken, and for more
// files than a package has records. Nothing found is an empty list.

// The plain files that match a pattern, any part of which may have wildcards. Case counts.
std::vector<std::string> FindMatches(const std::filesystem::path& sourceFolder,
                                     const std::string& pattern);

// All plain files in a folder and below it.
std::vector<std::string> FindTree(const std::filesystem::path& sourceFolder,
                                  const std::string& tree);

}  // namespace image

// What names and destinations of a package may be.
//
// The setup program composes paths of them and never looks at what they say. So every package is
// looked at here, when it is made and when it is verified. All texts are code page bytes; faults
// are told in UTF-8.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace image {

// What is wrong with a file's name, which ends each of its target paths; nullopt for a good one.
std::optional<std::string> FindNameFault(std::string_view name);

// The same for the header's default directory; "" is good and leaves the choice to the program.
std::optional<std::string> FindDirectoryFault(std::string_view directory);

// The same for a destination text.
//   name                the record's file name
//   defaultDirectory    what a path within the installation directory is taken to begin with
//   allowUnknownMacros  lets %...% words pass that are no macro where they stand, and lone % signs
// A file in a place of the setup program's own (removal program, log, INF file) is a fault too.
std::optional<std::string> FindDestinationFault(std::string_view destination, std::string_view name,
                                                std::string_view defaultDirectory,
                                                bool allowUnknownMacros);

// One text for each place that the file can go to, equal for equal places whatever their spelling.
std::vector<std::string> TargetKeys(std::string_view destination, std::string_view name);

// How many places the file goes to on every machine: a browser's plug-in directory is none.
size_t CountCertainPlaces(std::string_view destination);

}  // namespace image

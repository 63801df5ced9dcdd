// A destination is a list of elements between semicolons. An element with a colon is a directory as
// it stands; every other one is a macro, or nothing for the installation directory, and a subpath.

#include "tools/image/target_rules.h"

#include <algorithm>

#include "engine/resolver.h"
#include "tools/image/record_text.h"

namespace image {
namespace {

constexpr size_t kLongestPath = 259;
constexpr size_t kLongestName = 31;
constexpr size_t kShortestDirectory = 3;  // "C:\"

struct Element {
  MacroCode macro = MacroNone;
  bool isFullPath = false;  // the subpath is a directory as it stands
  std::string subpath;      // without the backslash behind the macro
};

// Every text up to a semicolon, and what is left behind the last one unless that is nothing.
std::vector<std::string> SplitElements(std::string_view destination) {
  std::vector<std::string> elements;
  while (!destination.empty()) {
    const size_t end = std::min(destination.find(';'), destination.size());
    elements.emplace_back(destination.substr(0, end));
    destination.remove_prefix(std::min(end + 1, destination.size()));
  }
  return elements;
}

Element ParseElement(const std::string& text) {
  size_t macroLength = 0;
  const MacroCode macro = ClassifyMacro(text.c_str(), &macroLength);
  if (macro != MacroAllBrowsers && !IsRelativeElement(text.c_str())) {
    return {MacroNone, true, text};
  }
  const bool hasBackslash = text.substr(macroLength).starts_with('\\');
  return {macro, false, text.substr(macroLength + (hasBackslash ? 1 : 0))};
}

// Windows takes these for devices in every folder, whatever stands behind a point.
bool IsDeviceName(std::string_view name) {
  std::string stem = ToUpper(name.substr(0, name.find('.')));
  stem.erase(stem.find_last_not_of(' ') + 1);
  for (const std::string_view device :
       {"CON", "PRN", "AUX", "NUL", "CLOCK$", "CONIN$", "CONOUT$"}) {
    if (stem == device) return true;
  }
  // The digits, and the raised 1, 2 and 3 of the code page.
  return stem.size() == 4 && (stem.starts_with("COM") || stem.starts_with("LPT")) &&
         std::string_view("123456789\xB9\xB2\xB3").find(stem[3]) != std::string_view::npos;
}

// One name between backslashes.
std::optional<std::string> FindPartFault(std::string_view part) {
  if (part.empty()) return "has an empty folder name; write each backslash once";
  if (part == "." || part == "..") return "has a folder " + Shown(part) + ", which leads elsewhere";
  for (const char c : part) {
    if (static_cast<unsigned char>(c) < 0x20) return "has a control character";
    if (std::string_view("<>\"|?*:/").find(c) != std::string_view::npos) {
      return std::string("has a ") + c + ", which no name on Windows can have";
    }
  }
  if (part.ends_with(' ') || part.ends_with('.')) {
    return "has a name that ends with a blank or a point, which Windows takes away";
  }
  if (IsDeviceName(part)) return "names the device " + Shown(part);
  return std::nullopt;
}

// A path without its drive; one backslash may end it.
std::optional<std::string> FindPartsFault(std::string_view path) {
  if (path.ends_with('\\')) path.remove_suffix(1);
  while (!path.empty()) {
    const size_t end = std::min(path.find('\\'), path.size());
    if (auto fault = FindPartFault(path.substr(0, end))) return fault;
    path.remove_prefix(end);
    if (path == "\\") return FindPartFault("");
    if (!path.empty()) path.remove_prefix(1);
  }
  return std::nullopt;
}

std::optional<std::string> FindFullPathFault(std::string_view path) {
  const bool hasDrive = path.size() >= 3 && path[1] == ':' && path[2] == '\\' &&
                        ((path[0] >= 'A' && path[0] <= 'Z') || (path[0] >= 'a' && path[0] <= 'z'));
  if (!hasDrive) return "is no directory in full, like C:\\Folder";
  return FindPartsFault(path.substr(3));
}

// Text between two percent signs of one name, where no macro can stand.
std::optional<std::string> FindUnknownMacro(std::string_view subpath) {
  const size_t begin = subpath.find('%');
  if (begin == std::string_view::npos) return std::nullopt;
  const size_t end = subpath.find_first_of("%\\", begin + 1);
  if (end == std::string_view::npos) return std::nullopt;
  if (subpath[end] == '\\') return FindUnknownMacro(subpath.substr(end));
  return std::string(subpath.substr(begin, end - begin + 1));
}

bool IsInInstallDirectory(const Element& element) {
  return !element.isFullPath && (element.macro == MacroNone || element.macro == MacroBaseDir);
}

// Length of `path` once a backslash stands behind it.
size_t LengthAsFolder(std::string_view path) {
  return path.size() + (path.empty() || path.ends_with('\\') ? 0 : 1);
}

// Of the path that the element makes, or of the shortest that it can make.
size_t PathLength(const Element& element, std::string_view name,
                  std::string_view defaultDirectory) {
  size_t length = LengthAsFolder(element.subpath) + name.size();
  if (!element.isFullPath) {
    const bool hasDefault = IsInInstallDirectory(element) && !defaultDirectory.empty();
    length += hasDefault ? LengthAsFolder(defaultDirectory) : kShortestDirectory;
  }
  return length;
}

std::optional<std::string> FindElementFault(const Element& element) {
  return element.isFullPath ? FindFullPathFault(element.subpath) : FindPartsFault(element.subpath);
}

}  // namespace

std::optional<std::string> FindNameFault(std::string_view name) {
  if (name.empty()) return "is empty";
  if (name.size() > kLongestName) {
    return "has " + std::to_string(name.size()) + " characters; at most 31 fit";
  }
  if (name.find('\\') != std::string_view::npos) return "has a backslash; give the bare name";
  return FindPartFault(name);
}

std::optional<std::string> FindDirectoryFault(std::string_view directory) {
  if (directory.empty()) return std::nullopt;
  if (directory.size() > kLongestPath) {
    return "has " + std::to_string(directory.size()) + " characters; at most 259 fit";
  }
  return FindFullPathFault(directory);
}

std::optional<std::string> FindDestinationFault(std::string_view destination, std::string_view name,
                                                std::string_view defaultDirectory,
                                                bool allowUnknownMacros) {
  if (destination.empty()) return "is empty: the file would go nowhere; name a place";
  if (destination.size() > kLongestPath) {
    return "has " + std::to_string(destination.size()) + " characters; at most 259 fit";
  }
  for (const std::string& text : SplitElements(destination)) {
    const Element element = ParseElement(text);
    if (const auto word = FindUnknownMacro(element.subpath); word && !allowUnknownMacros) {
      return "has the word " + Shown(*word) +
             ", which is no macro there; mend it, or allow unknown macros";
    }
    if (auto fault = FindElementFault(element)) return fault;
    if (PathLength(element, name, defaultDirectory) > kLongestPath) {
      return "makes a path of more than 259 characters of " + Shown(text);
    }
  }
  return std::nullopt;
}

std::vector<std::string> TargetKeys(std::string_view destination, std::string_view name) {
  std::vector<std::string> keys;
  for (const std::string& text : SplitElements(destination)) {
    const Element element = ParseElement(text);
    std::string folder = ToUpper(element.subpath);
    if (folder.ends_with('\\')) folder.pop_back();
    std::vector<MacroCode> macros{IsInInstallDirectory(element) ? MacroBaseDir : element.macro};
    if (element.macro == MacroAllBrowsers) macros = {MacroNetscape, MacroExplorer, MacroOpera};
    for (const MacroCode macro : macros) {
      keys.push_back(std::to_string(macro) + '\\' + folder + '\\' + ToUpper(name));
    }
  }
  return keys;
}

size_t CountCertainPlaces(std::string_view destination) {
  const std::vector<std::string> elements = SplitElements(destination);
  return static_cast<size_t>(
      std::count_if(elements.begin(), elements.end(), [](const std::string& text) {
        const MacroCode macro = ParseElement(text).macro;
        return macro != MacroNetscape && macro != MacroExplorer && macro != MacroOpera &&
               macro != MacroAllBrowsers;
      }));
}

}  // namespace image

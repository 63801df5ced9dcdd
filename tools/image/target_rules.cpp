#include "tools/image/target_rules.h"

#include <algorithm>

#include "tools/image/destination_elements.h"
#include "tools/image/record_text.h"

namespace image {
namespace {

constexpr size_t kLongestPath = 259;
constexpr size_t kLongestName = 31;
constexpr size_t kShortestDirectory = 3;  // "C:\"

// What the setup program itself keeps in the Windows directory.
constexpr struct {
  std::string_view name, what;
} kOwnFiles[] = {{"MORIVRMV.EXE", "removal program"},
                 {"MORIVLOG.TXT", "log"},
                 {"MORIV.INF", "list of what Windows deletes after a removal"}};
// Where that directory is on nearly every PC.
constexpr std::string_view kUsualWindowsDirectories[] = {"C:\\WINDOWS", "C:\\WINNT"};

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
    if (static_cast<unsigned char>(c) < 0x20 || c == 0x7F) return "has a control character";
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

// A percent sign where no macro can stand: alone, or with another one behind it in the same name.
std::optional<std::string> FindPercentFault(std::string_view subpath) {
  const size_t begin = subpath.find('%');
  if (begin == std::string_view::npos) return std::nullopt;
  const size_t end = subpath.find_first_of("%\\", begin + 1);
  const std::string mend = "; mend it, or allow unknown macros";
  if (end == std::string_view::npos || subpath[end] == '\\') {
    return "has a lone % in " + Shown(subpath) + ", as of a macro that was cut short" + mend;
  }
  return "has the word " + Shown(subpath.substr(begin, end - begin + 1)) +
         ", which is no macro there" + mend;
}

// Length of `path` once a backslash stands behind it.
size_t LengthAsFolder(std::string_view path) {
  return path.size() + (path.empty() || path.ends_with('\\') ? 0 : 1);
}

// Of the path that the element makes, or of the shortest that it can make.
size_t PathLength(const DestinationElement& element, std::string_view name,
                  std::string_view defaultDirectory) {
  size_t length = LengthAsFolder(element.subpath) + name.size();
  if (!element.isFullPath) {
    const bool hasDefault = element.IsInInstallDirectory() && !defaultDirectory.empty();
    length += hasDefault ? LengthAsFolder(defaultDirectory) : kShortestDirectory;
  }
  return length;
}

std::string_view WithoutEndingBackslash(std::string_view path) {
  return path.ends_with('\\') ? path.substr(0, path.size() - 1) : path;
}

// A file that the setup program or Windows would write over, or take for its own and delete.
std::optional<std::string> FindOwnFileFault(const DestinationElement& element,
                                            std::string_view name) {
  const std::string folder = ToUpper(WithoutEndingBackslash(element.subpath));
  const bool isInWindows = element.isFullPath
                               ? std::ranges::find(kUsualWindowsDirectories, folder) !=
                                     std::end(kUsualWindowsDirectories)
                               : element.macro == MacroWindowsDir && folder.empty();
  if (!isInWindows) return std::nullopt;
  for (const auto& [own, what] : kOwnFiles) {
    if (ToUpper(name) != own) continue;
    return "sends " + Shown(name) + " to the place of the setup program's own " +
           std::string(what) + "; name another";
  }
  return std::nullopt;
}

std::optional<std::string> FindElementFault(const DestinationElement& element) {
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
    const DestinationElement element = ParseElement(text);
    if (!allowUnknownMacros) {
      if (auto fault = FindPercentFault(element.subpath)) return fault;
    }
    if (auto fault = FindElementFault(element)) return fault;
    if (auto fault = FindOwnFileFault(element, name)) return fault;
    if (PathLength(element, name, defaultDirectory) > kLongestPath) {
      return "makes a path of more than 259 characters of " + Shown(text);
    }
  }
  return std::nullopt;
}

std::vector<std::string> TargetKeys(std::string_view destination, std::string_view name) {
  std::vector<std::string> keys;
  for (const std::string& text : SplitElements(destination)) {
    const DestinationElement element = ParseElement(text);
    const std::string folder = ToUpper(WithoutEndingBackslash(element.subpath));
    for (const MacroCode macro : element.Macros()) {
      keys.push_back(std::to_string(macro) + '\\' + folder + '\\' + ToUpper(name));
    }
  }
  return keys;
}

size_t CountCertainPlaces(std::string_view destination) {
  const std::vector<std::string> elements = SplitElements(destination);
  return static_cast<size_t>(std::ranges::count_if(
      elements, [](const std::string& text) { return ParseElement(text).IsCertain(); }));
}

}  // namespace image

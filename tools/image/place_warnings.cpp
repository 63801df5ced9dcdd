// What a removal leaves is found by playing it: every directory knows how many files and
// directories of the package it holds.

#include "tools/image/place_warnings.h"

#include <algorithm>
#include <map>
#include <optional>
#include <set>

#include "tools/image/destination_elements.h"
#include "tools/image/record_text.h"

namespace image {
namespace {

struct UsualPlace {
  std::string directory;  // in upper case
  const char* macro;
};

std::vector<UsualPlace> UsualPlaces(std::string_view defaultDirectory) {
  std::vector<UsualPlace> places = {
      {"C:\\WINDOWS\\SYSTEM32", "%SYS_DIR%"},
      {"C:\\WINDOWS\\SYSWOW64", "%SYS_DIR%"},
      {"C:\\WINDOWS\\SYSTEM", "%SYS_DIR%"},
      {"C:\\WINNT\\SYSTEM32", "%SYS_DIR%"},
      {"C:\\WINDOWS", "%REMOVE_DIR%"},
      {"C:\\WINNT", "%REMOVE_DIR%"},
      {"C:\\PROGRAM FILES\\INTERNET EXPLORER\\PLUGINS", "%PLUGIN_IE_DIR%"}};
  std::string chosen = ToUpper(defaultDirectory);
  if (chosen.ends_with('\\')) chosen.pop_back();
  if (chosen.empty()) chosen = "C:\\PROGRAM FILES\\MORIV";
  if (chosen.find('\\') != std::string::npos) places.push_back({chosen, "%INSTALL_DIR%"});
  return places;
}

class PlaceInspector {
 public:
  explicit PlaceInspector(std::string_view defaultDirectory)
      : usualPlaces_(UsualPlaces(defaultDirectory)) {}

  std::vector<PlaceWarning> Inspect(const std::vector<std::string>& destinations) {
    for (size_t file = 0; file < destinations.size(); ++file) {
      for (const std::string& text : SplitElements(destinations[file])) {
        const DestinationElement element = ParseElement(text);
        if (element.isFullPath) {
          InspectFullPath(file, text);
        } else {
          Install(file, element);
        }
      }
    }
    for (const std::string& destination : destinations) {
      for (const std::string& text : SplitElements(destination)) Remove(ParseElement(text));
    }
    for (const auto& [key, directory] : directories_) {
      if (!directory.shown.empty()) WarnOfLeft(directory);
    }
    std::ranges::stable_sort(warnings_, {}, &PlaceWarning::file);
    return std::move(warnings_);
  }

 private:
  struct Directory {
    std::string shown;  // "" for one that no install makes
    size_t lastFile = 0;
    size_t entries = 0;  // files and directories of the package in it
  };

  void Warn(size_t file, const std::string& text) {
    if (told_.insert(text).second) warnings_.push_back({file, text});
  }

  void InspectFullPath(size_t file, std::string path) {
    if (path.ends_with('\\') && path.size() > 3) path.pop_back();
    const std::string upper = ToUpper(path);
    for (const auto& [directory, macro] : usualPlaces_) {
      if (!(upper + '\\').starts_with(directory + '\\')) continue;
      Warn(file, "names " + Shown(path) + ", where " + macro +
                     " leads on most PCs, but not on all; "
                     "write " +
                     Shown(macro + path.substr(directory.size())));
      return;
    }
    if (path.size() <= 3) return;  // a drive
    Warn(file, "leaves " + Shown(path) +
                   " behind after a removal, which takes no directory away "
                   "that is given in full; write a macro, as %INSTALL_DIR%, if one leads there");
  }

  // The directories on the way of a subpath below a macro's, the outermost first.
  static std::vector<std::string> Levels(std::string subpath) {
    if (subpath.ends_with('\\')) subpath.pop_back();
    std::vector<std::string> levels;
    for (size_t end = 0; !subpath.empty() && end != std::string::npos;) {
      end = subpath.find('\\', end == 0 ? 0 : end + 1);
      levels.push_back(subpath.substr(0, end));
    }
    return levels;
  }

  Directory& At(MacroCode macro, std::string_view level) {
    return directories_[std::to_string(macro) + '\\' + ToUpper(level)];
  }

  void Install(size_t file, const DestinationElement& element) {
    const std::string base = element.macroText.empty() ? "" : element.macroText + '\\';
    for (const MacroCode macro : element.Macros()) {
      Directory* above = &At(macro, "");
      for (const std::string& level : Levels(element.subpath)) {
        Directory& directory = At(macro, level);
        if (directory.shown.empty()) {
          directory.shown = base + level;
          ++above->entries;
        }
        directory.lastFile = file;
        above = &directory;
      }
      ++above->entries;
    }
  }

  void Remove(const DestinationElement& element) {
    if (element.isFullPath) return;
    std::vector<std::string> levels = Levels(element.subpath);
    if (levels.empty()) return;
    for (const MacroCode macro : element.Macros()) {
      Directory& directory = At(macro, levels.back());
      if (--directory.entries > 0) continue;
      directory.shown.clear();
      --At(macro, levels.size() > 1 ? levels[levels.size() - 2] : "").entries;
    }
  }

  void WarnOfLeft(const Directory& directory) {
    Warn(directory.lastFile,
         "leaves " + Shown(directory.shown) +
             " behind after a removal, which behind each file takes "
             "only the last directory of its place away; let a file with the destination " +
             Shown(directory.shown) + " follow");
  }

  const std::vector<UsualPlace> usualPlaces_;
  std::map<std::string, Directory> directories_;  // by macro and subpath in upper case
  std::set<std::string> told_;                    // once for all files of a place
  std::vector<PlaceWarning> warnings_;
};

}  // namespace

std::vector<PlaceWarning> FindPlaceWarnings(const std::vector<std::string>& destinations,
                                            std::string_view defaultDirectory) {
  return PlaceInspector(defaultDirectory).Inspect(destinations);
}

}  // namespace image

#include "tools/image/file_places.h"

#include <algorithm>
#include <iterator>

#include "machine/code_page.h"
#include "tools/image/destination_elements.h"
#include "tools/image/host_text.h"
#include "tools/image/record_text.h"
#include "tools/image/target_rules.h"

namespace image {
namespace {

constexpr struct {
  MacroCode macro;
  const char* name;
} kDirectories[] = {{MacroBaseDir, "INSTALL_DIR"},       {MacroWindowsDir, "REMOVE_DIR"},
                    {MacroSystemDir, "SYS_DIR"},         {MacroNetscape, "PLUGIN_NS_DIR"},
                    {MacroExplorer, "PLUGIN_IE_DIR"},    {MacroOpera, "PLUGIN_OPERA_DIR"},
                    {MacroAllBrowsers, "PLUGIN_ALL_DIR"}};

const char* DirectoryOf(MacroCode macro) {
  if (macro == MacroNone) macro = MacroBaseDir;
  return std::ranges::find(kDirectories, macro, [](const auto& entry) { return entry.macro; })
      ->name;
}

std::string Joined(std::string folder, const std::string& name) {
  if (!folder.empty() && !folder.ends_with('\\')) folder += '\\';
  return folder + name;
}

// Without a ':' no host takes it for a root.
std::string TreeFolder(const DestinationElement& element) {
  if (!element.isFullPath) return Joined(DirectoryOf(element.macro), element.subpath);
  std::string folder = element.subpath;
  std::erase(folder, ':');
  return ToUpper(folder.substr(0, 1)) + folder.substr(1);
}

}  // namespace

std::vector<FilePlace> PlacesOf(const FileRecord& record) {
  const std::string name = FieldText(record.fileName);
  const std::string destination = FieldText(record.destination);
  const std::vector<std::string> keys = TargetKeys(destination, name);
  std::vector<FilePlace> places;
  for (const std::string& text : SplitElements(destination)) {
    const DestinationElement element = ParseElement(text);
    const std::string below = Joined(element.subpath, name);
    for (const MacroCode macro : element.Macros()) {
      const std::string root =
          element.isFullPath ? "" : std::string("%") + DirectoryOf(macro) + "%\\";
      places.push_back(
          {keys.at(places.size()), machine::ToUtf8(root + below), element.IsCertain()});
    }
  }
  return places;
}

std::filesystem::path FlatPlace(const FileRecord& record) {
  return PathOf(Utf8Text(record.fileName));
}

std::filesystem::path TreePlace(const FileRecord& record) {
  const std::vector<std::string> elements = SplitElements(FieldText(record.destination));
  std::string place =
      Joined(TreeFolder(ParseElement(elements.front())), FieldText(record.fileName));
  std::replace(place.begin(), place.end(), '\\', '/');
  return PathOf(machine::ToUtf8(place));
}

}  // namespace image

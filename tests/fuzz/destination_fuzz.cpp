// The resolver, on a machine with Netscape and Opera: elements are resolved one after the other,
// each to a place below a directory that it can name; and the stand-in's own way from a path to a
// file of the host, which must not lead out of the machine.
//
//   line 1   the base directory
//   line 2   the file name; a text that fills its field has no NUL
//   rest     the destination
#include <sstream>
#include <utility>

#include "engine/resolver.h"
#include "machine/drives.h"
#include "machine/open_objects.h"
#include "package/paths.h"
#include "platform/text.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

struct BrowsedMachine : TestMachine {
  BrowsedMachine() {
    Write("drive_c/ns/Plugins/a", "");
    Write("drive_c/opera/Plugins/a", "");
    SetRegistryText(AppPathsKey("Netscape.exe"), "Path", "C:\\ns");
    SetRegistryText(AppPathsKey("Opera.exe"), "Path", "C:\\opera;C:\\other");
  }
};

// The result, and path and directory of each target.
using Resolution = std::pair<StatusCode, std::vector<std::pair<std::string, std::string>>>;

Resolution Resolve(const std::string& base, const std::string& name,
                   const std::string& destination) {
  FileRecord record = {};
  SetField(record.fileName, name);
  SetField(record.destination, destination);
  SetupContext context = {};
  TargetList list = {};
  Resolution resolution = {ResolveTargets(&context, &list, base.c_str(), &record, false), {}};
  for (int32_t i = 0; i < list.count; ++i)
    resolution.second.emplace_back(list.entries[i].path, list.entries[i].directory);
  FreeTargets(&list);
  return resolution;
}

std::string WithBackslash(const std::string& text) {
  return text.empty() || text.back() == '\\' ? text : text + '\\';
}

// The element as it stands, or a directory and the element's end.
bool IsPlaceOf(const std::string& element, const std::string& base, const std::string& place) {
  const std::string asItStands = WithBackslash(element);
  if (place == asItStands && element.find(':') != std::string::npos) return true;
  const std::string roots[] = {WithBackslash(base), "C:\\windows\\", "C:\\windows\\system32\\",
                               "C:\\ns\\Plugins\\", "C:\\opera\\Plugins\\"};
  return std::ranges::any_of(roots, [&](const std::string& root) {
    return place.starts_with(root) && asItStands.ends_with(place.substr(root.size()));
  });
}

// A path leads nowhere out of the machine's folder.
void ExpectInside(const TestMachine& pc, const std::string& path) {
  const auto location = machine::Locate(path);
  EXPECT_TRUE(!location ||
              location->host.lexically_normal().string().starts_with(pc.Host("drive_").string()))
      << location->host;
  (void)FileExists(path.c_str());
  (void)DirectoryExists(path.c_str());
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const BrowsedMachine pc;
  std::istringstream input(std::string(data, data + size));
  const auto take = [&input](char end, size_t limit) {
    std::string text;
    std::getline(input, text, end);
    return std::string(text.c_str()).substr(0, limit);
  };
  const std::string base = take('\n', kPathSize - 1);
  const std::string name = take('\n', sizeof(FileRecord::fileName));
  const std::string rest = take('\0', size);
  const std::string destination = rest.substr(0, sizeof(FileRecord::destination));

  Resolution inTurn = {StatusOk, {}};
  std::istringstream elements(destination);
  for (std::string element; inTurn.first >= 0 && std::getline(elements, element, ';');) {
    // The semicolon makes an empty element one too; there is no room for it in a full field.
    const bool isFull = element.size() == sizeof(FileRecord::destination);
    const auto [result, targets] = Resolve(base, name, isFull ? element : element + ';');
    for (const auto& [path, directory] : targets) {
      EXPECT_TRUE(path.ends_with(name));
      const std::string place = path.substr(0, path.size() - name.size());
      EXPECT_TRUE(IsPlaceOf(element, base, place)) << element << " -> " << path;
      EXPECT_TRUE(directory.empty() || WithBackslash(directory) == place) << directory;
      ExpectInside(pc, path);
    }
    EXPECT_LE(targets.size(), 2u);
    EXPECT_TRUE(!targets.empty() || result == StatusBufferTooSmall || result == StatusNoExplorer);
    inTurn.first = result;
    inTurn.second.insert(inTurn.second.end(), targets.begin(), targets.end());
  }
  EXPECT_EQ(Resolve(base, name, destination), inTurn);
  ExpectInside(pc, base);
  ExpectInside(pc, rest);
  EXPECT_EQ(machine::OpenObjects(), "");
  return 0;
}

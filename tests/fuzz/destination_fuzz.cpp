// The resolver against a second reading of its rules, on a machine with Netscape and Opera; and the
// stand-in's own way from a path to a file of the host, which must not lead out of the machine.
//
//   line 1   the base directory
//   line 2   the file name; a text that fills its field has no NUL
//   rest     the destination
#include <optional>
#include <utility>
#include <vector>

#include "engine/resolver.h"
#include "machine/drives.h"
#include "machine/open_objects.h"
#include "package/paths.h"
#include "platform/text.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/product_test.h"

namespace {

using Target = std::pair<std::string, std::string>;  // path, directory

constexpr char kNetscape[] = "C:\\ns\\Plugins";
constexpr char kOpera[] = "C:\\opera\\Plugins";

struct PlainMacro {
  std::string_view text;
  StatusCode missing;                    // when there are no directories
  std::vector<std::string> directories;  // a base directory is put in
};

std::vector<PlainMacro> Macros(const std::string& base) {
  return {{"%REMOVE_DIR%", 0, {"C:\\windows"}},
          {"%REMOVEDIR%", 0, {"C:\\windows"}},
          {"%INSTALL_DIR%", 0, {base}},
          {"%CURDIR%", 0, {base}},
          {"%CUR_DIR%", 0, {base}},
          {"%SYS_DIR%", 0, {"C:\\windows\\system32"}},
          {"%SYSDIR%", 0, {"C:\\windows\\system32"}},
          {"%PLUGIN_NS_DIR%", StatusNoNetscape, {kNetscape}},
          {"%PLUGIN_IE_DIR%", StatusNoExplorer, {}},
          {"%PLUGIN_OPERA_DIR%", StatusNoOpera, {kOpera}},
          {"%PLUGIN_ALL_DIR%", 0, {kNetscape, kOpera}},
          {"", 0, {base}}};
}

std::string WithBackslash(const std::string& text) {
  return text.empty() || text.back() == '\\' ? text : text + '\\';
}

StatusCode ResolvePlainly(const std::string& base, const std::string& name, std::string rest,
                          std::vector<Target>* targets) {
  StatusCode result = StatusOk;
  while (!rest.empty()) {
    const std::string element = rest.substr(0, rest.find(';'));
    rest.erase(0, std::min(element.size() + 1, rest.size()));
    const std::vector<PlainMacro> macros = Macros(base);
    const auto macro = std::find_if(macros.begin(), macros.end(), [&](const PlainMacro& row) {
      return BeginsWithIgnoringCase(element.c_str(), std::string(row.text).c_str());
    });
    const bool isAbsolute =
        macro->text != "%PLUGIN_ALL_DIR%" && element.find(':') != std::string::npos;
    if (!isAbsolute && macro->directories.empty()) result = macro->missing;
    for (const std::string& directory :
         isAbsolute ? std::vector<std::string>{element} : macro->directories) {
      std::string tail = isAbsolute ? "" : element.substr(macro->text.size());
      const bool hasTail =
          macro->directories.size() > 1 ? tail != "\\" && !tail.empty() : !tail.empty();
      if (tail.starts_with('\\')) tail.erase(0, 1);
      const std::string place = hasTail ? WithBackslash(directory) + tail : directory;
      const std::string path = WithBackslash(place) + name;
      if (path.size() >= kPathSize) return StatusBufferTooSmall;
      targets->emplace_back(path, hasTail && place.size() + 1 < kPathSize ? place : "");
      result = StatusOk;
    }
  }
  return result;
}

void RegisterBrowsers(const TestMachine& pc) {
  pc.Write("drive_c/ns/Plugins/a", "");
  pc.Write("drive_c/opera/Plugins/a", "");
  SetRegistryText(AppPathsKey("Netscape.exe"), "Path", "C:\\ns");
  SetRegistryText(AppPathsKey("Opera.exe"), "Path", "C:\\opera;C:\\other");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static TestMachine pc;
  static const bool hasBrowsers = (RegisterBrowsers(pc), true);
  EXPECT_TRUE(hasBrowsers);
  FuzzInput input(data, size);
  const auto takeText = [&](size_t limit) {
    const std::string line = input.TakeLine();
    return line.substr(0, std::min(line.find('\0'), limit));
  };
  const std::string base = takeText(kPathSize - 1);
  FileRecord record = {};
  const std::string name = takeText(sizeof(record.fileName));
  const std::string_view rest = input.rest();
  const std::string destination(
      rest.substr(0, std::min(rest.find('\0'), sizeof(record.destination))));
  name.copy(record.fileName, name.size());
  destination.copy(record.destination, destination.size());

  std::vector<Target> expected;
  const StatusCode expectedResult = ResolvePlainly(base, name, destination, &expected);
  SetupContext context = {};
  TargetList list = {};
  EXPECT_EQ(ResolveTargets(&context, &list, base.c_str(), &record, false), expectedResult);
  std::vector<Target> targets;
  for (int32_t i = 0; i < list.count; ++i) {
    targets.emplace_back(list.entries[i].path, list.entries[i].directory);
  }
  FreeTargets(&list);
  EXPECT_EQ(targets, expected);

  targets.emplace_back(base, rest);
  for (const auto& [path, directory] : targets) {
    for (const std::string& text : {path, directory}) {
      const auto location = machine::Locate(text);
      EXPECT_TRUE(!location || location->host.lexically_normal().string().starts_with(
                                   pc.Host("drive_").string()))
          << location->host;
      (void)FileExists(text.c_str());
      (void)DirectoryExists(text.c_str());
    }
  }
  EXPECT_EQ(machine::OpenObjects(), "");
  return 0;
}

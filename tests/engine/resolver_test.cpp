// What keeps one element of a destination from being resolved, and what that does to the others.
// What each macro stands for is shown by the scenarios.
#include "engine/resolver.h"

#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

class Resolver : public ProductTest {
 protected:
  // "RESULT PATH[DIRECTORY] ...", with the directory of a target that has one.
  std::string Resolve(const std::string& destination) {
    FileRecord record = {};
    SetField(record.fileName, "a.dll");
    SetField(record.destination, destination);
    TargetList list = {7, nullptr};  // not its own
    const StatusCode result = ResolveTargets(&context, &list, "C:\\Moriv", &record, true);
    std::ostringstream text;
    text << result;
    for (int32_t i = 0; i < list.count; ++i) {
      const TargetEntry& target = list.entries[i];
      text << ' ' << target.path;
      if (target.directory[0] != '\0') text << '[' << target.directory << ']';
    }
    FreeTargets(&list);
    return text.str();
  }
};

TEST_F(Resolver, SkipsAMissingBrowserAndTellsOfItWhenNothingElseIsBehindIt) {
  const std::pair<const char*, const char*> rows[] = {
      {"", "1"},
      {"%PLUGIN_ALL_DIR%", "1"},
      {"%PLUGIN_ALL_DIR%;%INSTALL_DIR%", "1 C:\\Moriv\\a.dll"},
      {"%PLUGIN_NS_DIR%;b;", "1 C:\\Moriv\\b\\a.dll[C:\\Moriv\\b]"},
      {"b;%PLUGIN_NS_DIR%", "100005 C:\\Moriv\\b\\a.dll[C:\\Moriv\\b]"},
      {"%PLUGIN_NS_DIR%;%PLUGIN_IE_DIR%\\x", "100006"},
      {"%PLUGIN_OPERA_DIR%;%PLUGIN_ALL_DIR%\\x", "100007"},
  };
  for (const auto& [destination, targets] : rows) EXPECT_EQ(Resolve(destination), targets);
  const std::vector<std::string> missing = {"23/1", "25/1", "27/1"};
  std::vector<std::string> events = Events();
  events.resize(missing.size());
  EXPECT_EQ(events, missing);
}

TEST_F(Resolver, StopsAtAPathOf260CharactersAndKeepsWhatWasFoundBefore) {
  InstallBrowser("Opera.exe", "opera");
  const std::string opera = "C:\\opera\\Plugins";
  const std::pair<std::string, std::string> rows[] = {
      {"", "C:\\Moriv\\"}, {"%plugin_all_dir%\\", "C:\\opera\\Plugins\\"}};
  for (const auto& [macro, directory] : rows) {
    const std::string tail(259 - directory.size() - sizeof("a.dll"), 'd');
    const std::string place = directory + tail;
    std::string element = macro + tail;
    EXPECT_EQ(Resolve(element), "1 " + place + "\\a.dll[" + place + "]");
    element += 'd';
    EXPECT_EQ(Resolve(element), "-1000001");
    element.insert(0, 1, ';');
    EXPECT_EQ(Resolve(element), "-1000001 C:\\Moriv\\a.dll");
  }
}

TEST_F(Resolver, RefusesWhatIsMissing) {
  FileRecord record = {};
  TargetList list = {};
  size_t length = 7;
  char path[kPathSize] = {};
  EXPECT_EQ(ResolveTargets(nullptr, &list, "C:\\", &record, false), StatusBadArgument);
  EXPECT_EQ(ResolveTargets(&context, nullptr, "C:\\", &record, false), StatusBadArgument);
  EXPECT_EQ(ResolveTargets(&context, &list, "C:\\", nullptr, false), StatusBadArgument);
  EXPECT_EQ(ResolveElement(path, sizeof(path), nullptr, 0, nullptr, &record), StatusBadArgument);
  EXPECT_EQ(ResolveElement(path, sizeof(path), nullptr, 0, "C:\\", nullptr), StatusBadArgument);
  EXPECT_EQ(ResolveElement(nullptr, 0, nullptr, 0, "C:\\", &record), StatusBadArgument);
  EXPECT_EQ(ClassifyMacro(nullptr, &length), MacroNone);
  EXPECT_EQ(length, 7u);
}

}  // namespace

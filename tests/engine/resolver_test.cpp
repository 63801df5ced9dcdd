// What keeps one element of a destination from being resolved, and what that does to the others.
// What each macro stands for is shown by the scenarios.
#include "engine/resolver.h"

#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

using Resolver = ProductTest;

TEST_F(Resolver, KeepsWhatWasFoundBeforeAnElementThatItCanNotResolve) {
  InstallBrowser("Opera.exe", "opera");
  const std::string fits(244, 'd');  // behind "C:\\Moriv\\", in front of "\\a.dll"
  const std::string fitsOpera(236, 'd');
  // The result, and the paths.
  const std::pair<std::string, std::string> rows[] = {
      {"", "1"},
      {"%PLUGIN_NS_DIR%;b;", "1 C:\\Moriv\\b\\a.dll"},
      {"b;%PLUGIN_NS_DIR%", "100005 C:\\Moriv\\b\\a.dll"},
      {"%PLUGIN_NS_DIR%;%PLUGIN_IE_DIR%\\x", "100006"},
      {"%PLUGIN_NS_DIR%;%PLUGIN_ALL_DIR%", "1 C:\\opera\\Plugins\\a.dll"},
      {"%INSTALL_DIR%;%PLUGIN_ALL_DIR%", "1 C:\\Moriv\\a.dll C:\\opera\\Plugins\\a.dll"},
      {fits, "1 C:\\Moriv\\" + fits + "\\a.dll"},
      {';' + fits + 'd', "-1000001 C:\\Moriv\\a.dll"},
      {"%plugin_all_dir%\\" + fitsOpera, "1 C:\\opera\\Plugins\\" + fitsOpera + "\\a.dll"},
      {"%plugin_all_dir%\\" + fitsOpera + 'd', "-1000001"},
  };
  for (const auto& [destination, expected] : rows) {
    FileRecord record = {};
    SetField(record.fileName, "a.dll");
    SetField(record.destination, destination);
    TargetList list = {7, nullptr};  // not its own
    std::string told = std::to_string(ResolveTargets(&context, &list, "C:\\Moriv", &record, false));
    for (int32_t i = 0; i < list.count; ++i) told += std::string(" ") + list.entries[i].path;
    FreeTargets(&list);
    EXPECT_EQ(told, expected);
  }
}

TEST_F(Resolver, RefusesWhatIsMissing) {
  FileRecord record = {};
  TargetList list = {};
  size_t length = 7;
  char path[kPathSize] = {};
  EXPECT_EQ((Results{ResolveTargets(nullptr, &list, "C:\\", &record, false),
                     ResolveTargets(&context, nullptr, "C:\\", &record, false),
                     ResolveTargets(&context, &list, "C:\\", nullptr, false),
                     ResolveElement(path, sizeof(path), nullptr, 0, nullptr, &record),
                     ResolveElement(path, sizeof(path), nullptr, 0, "C:\\", nullptr),
                     ResolveElement(nullptr, 0, nullptr, 0, "C:\\", &record)}),
            Results(6, StatusBadArgument));
  EXPECT_EQ(ClassifyMacro(nullptr, &length), MacroNone);
  EXPECT_EQ(length, 7u);
}

}  // namespace

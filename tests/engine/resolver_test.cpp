// From a destination to full paths.
#include "engine/resolver.h"

#include "tests/support/product_test.h"

namespace {

using Strings = std::vector<std::string>;

class Resolver : public ProductTest {
 protected:
  // The targets as "PATH [DIRECTORY]", the last line the result when it isn't 1.
  Strings Resolve(const std::string& destination) {
    FileRecord record = {};
    destination.copy(record.destination, sizeof(record.destination));
    (void)CopyText(record.fileName, "a.dll");
    TargetList list = {};
    const StatusCode status = ResolveTargets(&context, &list, context.installDir, &record, false);
    Strings lines;
    for (int32_t i = 0; i < list.count; ++i) {
      const TargetEntry& entry = list.entries[i];
      lines.push_back(std::string(entry.path) + (entry.directory[0] != '\0'
                                                     ? " [" + std::string(entry.directory) + "]"
                                                     : ""));
    }
    if (status != StatusOk) lines.push_back(std::to_string(status));
    FreeTargets(&list);
    return lines;
  }
};

TEST_F(Resolver, ElementsAreMacrosAndSubpathsOrAbsoluteDirectories) {
  const std::pair<const char*, Strings> rows[] = {
      {"", {}},
      {"%install_dir%\\bin", {"C:\\Moriv\\bin\\a.dll [C:\\Moriv\\bin]"}},
      {"D:\\Shared\\", {"D:\\Shared\\a.dll"}},
      {"%sysdir%\\sub\\", {"C:\\windows\\system32\\sub\\a.dll [C:\\windows\\system32\\sub\\]"}},
      {"x%SYS_DIR%", {"C:\\Moriv\\x%SYS_DIR%\\a.dll [C:\\Moriv\\x%SYS_DIR%]"}},
      {"%INSTALL_DIR%\\C:", {"%INSTALL_DIR%\\C:\\a.dll"}},
      {"\\\\a\\..\\b", {"C:\\Moriv\\\\a\\..\\b\\a.dll [C:\\Moriv\\\\a\\..\\b]"}},
      {";a;", {"C:\\Moriv\\a.dll", "C:\\Moriv\\a\\a.dll [C:\\Moriv\\a]"}},
  };
  for (const auto& [destination, targets] : rows)
    EXPECT_EQ(Resolve(destination), targets) << destination;
}

TEST_F(Resolver, AMissingBrowserSkipsItsElement) {
  const std::string noNetscape = std::to_string(StatusNoNetscape);
  EXPECT_EQ(Resolve("%PLUGIN_NS_DIR%"), Strings{noNetscape});
  EXPECT_EQ(Resolve("%PLUGIN_NS_DIR%;%INSTALL_DIR%"), Strings{"C:\\Moriv\\a.dll"});
  EXPECT_EQ(Resolve("%INSTALL_DIR%;%PLUGIN_NS_DIR%"), (Strings{"C:\\Moriv\\a.dll", noNetscape}));
  EXPECT_EQ(Resolve("%PLUGIN_NS_DIR%;%PLUGIN_ALL_DIR%"), Strings{noNetscape});
  EXPECT_EQ(Resolve("%PLUGIN_ALL_DIR%"), Strings{});
  EXPECT_EQ(Events(), Strings{}) << "single macros and unlogged walks tell nothing";
}

TEST_F(Resolver, PathsOfAFanOutEndAt259Characters) {
  InstallBrowser("Opera.exe", "Opera");  // "C:\Opera\Plugins\" and "\a.dll" have 17 and 6
  EXPECT_EQ(Resolve("%PLUGIN_ALL_DIR%" + std::string(236, 'd')).front().find(".dll "), 255u);
  EXPECT_EQ(Resolve("%PLUGIN_ALL_DIR%" + std::string(237, 'd')),
            Strings{std::to_string(StatusBufferTooSmall)});
}

}  // namespace

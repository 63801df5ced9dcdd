// From a destination to full paths.
#include "engine/resolver.h"

#include "tests/support/product_test.h"

namespace {

using Strings = std::vector<std::string>;

class Resolver : public ProductTest {
 protected:
  // The targets as "PATH [DIRECTORY]", the last line the result when it isn't 1.
  Strings Resolve(const std::string& destination, const std::string& name = "a.dll") {
    FileRecord record = {};
    destination.copy(record.destination, sizeof(record.destination));
    name.copy(record.fileName, sizeof(record.fileName));
    TargetList list = {};
    const StatusCode status =
        ResolveTargets(&context, &list, context.installDir, &record, logsBrowsers);
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

  bool logsBrowsers = false;
};

TEST_F(Resolver, ElementsAreMacrosAndSubpathsOrAbsoluteDirectories) {
  const std::pair<const char*, Strings> rows[] = {
      {"", {}},
      {"%INSTALL_DIR%", {"C:\\Moriv\\a.dll"}},
      {"%install_dir%\\bin", {"C:\\Moriv\\bin\\a.dll [C:\\Moriv\\bin]"}},
      {"bin", {"C:\\Moriv\\bin\\a.dll [C:\\Moriv\\bin]"}},
      {"D:\\Shared", {"D:\\Shared\\a.dll"}},
      {"D:\\Shared\\", {"D:\\Shared\\a.dll"}},
      {"%CURDIR%;%CUR_DIR%", {"C:\\Moriv\\a.dll", "C:\\Moriv\\a.dll"}},
      {"%REMOVE_DIR%\\sub", {"C:\\windows\\sub\\a.dll [C:\\windows\\sub]"}},
      {"%removedir%", {"C:\\windows\\a.dll"}},
      {"%SYS_DIR%sub", {"C:\\windows\\system32\\sub\\a.dll [C:\\windows\\system32\\sub]"}},
      {"%sysdir%\\sub\\", {"C:\\windows\\system32\\sub\\a.dll [C:\\windows\\system32\\sub\\]"}},
      {"%SYS-DIR%", {"C:\\Moriv\\%SYS-DIR%\\a.dll [C:\\Moriv\\%SYS-DIR%]"}},
      {"x%SYS_DIR%", {"C:\\Moriv\\x%SYS_DIR%\\a.dll [C:\\Moriv\\x%SYS_DIR%]"}},
      {"%INSTALL_DIR%\\C:", {"%INSTALL_DIR%\\C:\\a.dll"}},
      {"\\\\a\\..\\b", {"C:\\Moriv\\\\a\\..\\b\\a.dll [C:\\Moriv\\\\a\\..\\b]"}},
      {"a;b", {"C:\\Moriv\\a\\a.dll [C:\\Moriv\\a]", "C:\\Moriv\\b\\a.dll [C:\\Moriv\\b]"}},
      {"a;", {"C:\\Moriv\\a\\a.dll [C:\\Moriv\\a]"}},
      {";a", {"C:\\Moriv\\a.dll", "C:\\Moriv\\a\\a.dll [C:\\Moriv\\a]"}},
  };
  for (const auto& [destination, targets] : rows)
    EXPECT_EQ(Resolve(destination), targets) << destination;
}

TEST_F(Resolver, PathsEndAt259Characters) {
  // "C:\Moriv\" and "\a.dll" have 9 and 6.
  const std::string longest = "C:\\Moriv\\" + std::string(244, 'd');
  EXPECT_EQ(Resolve(std::string(244, 'd')), Strings{longest + "\\a.dll [" + longest + "]"});
  EXPECT_EQ(Resolve(std::string(245, 'd')), Strings{std::to_string(StatusBufferTooSmall)});
  EXPECT_EQ(Resolve("ok;" + std::string(245, 'd')).size(), 2u) << "what was found so far stands";
  EXPECT_EQ(Resolve(std::string(260, 'd')), Strings{std::to_string(StatusBufferTooSmall)});
  // A directory is given only when a character is to spare.
  const std::string longDirectory = "C:\\Moriv\\" + std::string(249, 'd');
  FileRecord record = {};
  std::string(249, 'd').copy(record.destination, 260);
  char path[300] = {};
  char directory[260] = {};
  EXPECT_EQ(ResolveElement(path, sizeof(path), directory, sizeof(directory), "C:\\Moriv", &record),
            1);
  EXPECT_EQ(directory, longDirectory);
  std::string(250, 'd').copy(record.destination, 260);
  directory[0] = '\0';
  EXPECT_EQ(ResolveElement(path, sizeof(path), directory, sizeof(directory), "C:\\Moriv", &record),
            1);
  EXPECT_STREQ(directory, "");
}

TEST_F(Resolver, FieldsFilledToTheirWidthEndThere) {
  EXPECT_EQ(Resolve("", std::string(32, 'n')), Strings{});
  EXPECT_EQ(Resolve("%INSTALL_DIR%", std::string(32, 'n')),
            Strings{"C:\\Moriv\\" + std::string(32, 'n')});
  const std::string elements = std::string(250, ';') + "%CURDIR%\\d";
  EXPECT_EQ(elements.size(), 260u);
  EXPECT_EQ(Resolve(elements).back(), "C:\\Moriv\\d\\a.dll [C:\\Moriv\\d]");
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

TEST_F(Resolver, AFanOutReachesEachBrowserThereIs) {
  InstallBrowser("Opera.exe", "Opera");
  InstallBrowser("Netscape.exe", "Netscape");
  logsBrowsers = true;
  EXPECT_EQ(Resolve("%plugin_all_dir%\\sub:x"),
            (Strings{"C:\\Netscape\\Plugins\\sub:x\\a.dll [C:\\Netscape\\Plugins\\sub:x]",
                     "C:\\Opera\\Plugins\\sub:x\\a.dll [C:\\Opera\\Plugins\\sub:x]"}));
  EXPECT_EQ(Events(), (Strings{"22/0", "25/1", "26/0"}));
  EXPECT_EQ(Resolve("%PLUGIN_IE_DIR%;%PLUGIN_ALL_DIR%\\"),
            (Strings{"C:\\Netscape\\Plugins\\a.dll", "C:\\Opera\\Plugins\\a.dll"}));
}

TEST_F(Resolver, NoSystemDirectoryEndsTheWalk) {
  FailAllCalls("GetSystemDirectoryA");
  EXPECT_EQ(Resolve("a;%SYS_DIR%;b"),
            (Strings{"C:\\Moriv\\a\\a.dll [C:\\Moriv\\a]", std::to_string(StatusNoSystemDir)}));
}

}  // namespace

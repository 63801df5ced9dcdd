#include "engine/resolver.h"

#include "engine/browsers.h"
#include "engine/install_pass.h"
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
  EXPECT_EQ(Resolve(std::string(244, 'd')).front().substr(0, 259).size(), 259u);
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

using Browsers = ProductTest;

TEST_F(Browsers, ResultsThatDoNotFitLeaveTheBufferAlone) {
  InstallBrowser("Opera.exe", "Opera");
  char buffer[260] = "old";
  EXPECT_EQ(FindOperaPluginDir(buffer, 16), 0);
  EXPECT_STREQ(buffer, "old");
  EXPECT_EQ(FindOperaPluginDir(buffer, 17), 1);
  EXPECT_STREQ(buffer, "C:\\Opera\\Plugins");
  EXPECT_EQ(FindOperaPluginDir(nullptr, 260), 0);
  EXPECT_EQ(FindExplorerPluginDir(buffer, 260), 0);
}

TEST_F(Browsers, ANavigatorDirectoryIsTakenAsItStands) {
  InstallBrowser("Netscape.exe", "Netscape");
  const std::string navigator = "SOFTWARE\\Netscape\\Netscape Navigator";
  SetRegistryText(navigator, "CurrentVersion", "4.7");
  char buffer[260] = "old";
  EXPECT_EQ(FindNetscapePluginDir(buffer, 260), 1);
  EXPECT_STREQ(buffer, "C:\\Netscape\\Plugins") << "no Plugins Directory: by App Paths";
  for (const std::string& directory : {std::string("D:\\gone;E:\\x"), std::string()}) {
    SetRegistryText(navigator + "\\4.7\\Main", "Plugins Directory", directory);
    EXPECT_EQ(FindNetscapePluginDir(buffer, 260), 1);
    EXPECT_EQ(buffer, directory);
  }
  SetRegistryText(navigator + "\\4.7\\Main", "Plugins Directory", "D:\\Plug");
  EXPECT_EQ(FindNetscapePluginDir(buffer, 7), 0) << "it doesn't fit, and App Paths isn't tried";
  EXPECT_STREQ(buffer, "");
  SetRegistryText(navigator + "\\4.7\\Main", "Plugins Directory", std::string(260, 'p'));
  EXPECT_EQ(FindNetscapePluginDir(buffer, 260), 1) << "no NUL in 260 bytes: absent";
  EXPECT_STREQ(buffer, "C:\\Netscape\\Plugins");
}

TEST_F(Browsers, OnlyTheFirstDirectoryOfAPathCounts) {
  pc.Write("drive_c/B/x", "");
  char path[] = "C:\\B;C:\\A";
  EXPECT_EQ(CleanAppPath(path), 1);
  EXPECT_STREQ(path, "C:\\B");
  char gone[] = "C:\\A;C:\\B";
  EXPECT_EQ(CleanAppPath(gone), 0);
  EXPECT_STREQ(gone, "C:\\A;C:\\B");
  char file[] = "C:\\B\\x";
  EXPECT_EQ(CleanAppPath(file), 0);
}

using Directories = ProductTest;

TEST_F(Directories, AreMadeFromTheTopDown) {
  EXPECT_EQ(MakeDirectories("C:\\a\\b\\c\\file.txt"), 1);
  EXPECT_TRUE(pc.Has("drive_c/a/b/c"));
  EXPECT_FALSE(pc.Has("drive_c/a/b/c/file.txt"));
  EXPECT_EQ(MakeDirectories("C:\\"), StatusInternal);
  EXPECT_EQ(MakeDirectories(nullptr), StatusInternal);
  EXPECT_EQ(MakeDirectories("\\a\\b"), StatusCreateDirFailed);
  EXPECT_EQ(MakeDirectories("Q:\\a\\b"), StatusCreateDirFailed);
  EXPECT_EQ(MakeDirectories((std::string(300, 'd') + "\\f").c_str()), StatusCreateDirFailed);
  EXPECT_EQ(CopyTarget("", "C:\\x"), StatusInternal);
  EXPECT_EQ(CopyTarget("C:\\absent", "C:\\x"), StatusCopyFailed);
}

}  // namespace

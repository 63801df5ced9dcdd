// Where the browsers keep their plug-ins.
#include "engine/browsers.h"

#include "tests/support/product_test.h"

namespace {

using Browsers = ProductTest;

TEST_F(Browsers, ResultsThatDoNotFitLeaveTheBufferAlone) {
  InstallBrowser("Opera.exe", "Opera");
  char buffer[260] = "old";
  EXPECT_EQ(FindOperaPluginDir(buffer, 16), 0);
  EXPECT_STREQ(buffer, "old");
  EXPECT_EQ(FindOperaPluginDir(buffer, 17), 1);
  EXPECT_STREQ(buffer, "C:\\Opera\\Plugins");
}

TEST_F(Browsers, ANavigatorDirectoryIsTakenAsItStands) {
  InstallBrowser("Netscape.exe", "Netscape");
  const std::string navigator = "SOFTWARE\\Netscape\\Netscape Navigator";
  SetRegistryText(navigator, "CurrentVersion", "4.7");
  const std::string byAppPath = "C:\\Netscape\\Plugins";
  char buffer[260] = "old";
  EXPECT_EQ(FindNetscapePluginDir(buffer, 260), 1);
  EXPECT_EQ(buffer, byAppPath) << "there is no Plugins Directory";
  for (const std::string& directory : {std::string("D:\\gone;E:\\x"), std::string(),
                                       std::string(260, 'p'), std::string("D:\\Plug")}) {
    SetRegistryText(navigator + "\\4.7\\Main", "Plugins Directory", directory);
    EXPECT_EQ(FindNetscapePluginDir(buffer, 260), 1);
    EXPECT_EQ(buffer, directory.size() < 260 ? directory : byAppPath);
  }
  buffer[0] = '\0';
  EXPECT_EQ(FindNetscapePluginDir(buffer, 7), 0) << "it doesn't fit, and App Paths isn't tried";
  EXPECT_STREQ(buffer, "");
}

TEST_F(Browsers, AValueIsReadUpTo260BytesWithOrWithoutItsNul) {
  const std::string key = AppPathsKey("Opera.exe");
  char data[260] = {};
  const auto read = [&](DWORD count) {
    return ReadRegistryValue(HKEY_LOCAL_MACHINE, key.c_str(), "Path", data, &count);
  };
  for (const size_t size : {259u, 260u, 261u}) {  // with its NUL
    SetRegistryText(key, "Path", std::string(size - 1, 'p') + '\0');
    EXPECT_EQ(read(260), size <= 260) << size;
    SetRegistryText(key, "Path", std::string(size, 'p'));
    EXPECT_EQ(read(260), size <= 259) << size;
  }
  SetRegistryText(key, "Path", "");
  EXPECT_EQ(read(0), 0);
  DWORD count = sizeof(data);
  for (const int result :
       {ReadRegistryValue(HKEY_LOCAL_MACHINE, "", "Path", data, &count),
        ReadRegistryValue(HKEY_LOCAL_MACHINE, key.c_str(), "Path", nullptr, &count),
        ReadRegistryValue(HKEY_LOCAL_MACHINE, key.c_str(), "Path", data, nullptr),
        FindNetscapePluginDir(nullptr, 260), FindExplorerPluginDir(nullptr, 260),
        FindOperaPluginDir(nullptr, 260)}) {
    EXPECT_EQ(result, 0);
  }
}

}  // namespace

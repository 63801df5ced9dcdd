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
  EXPECT_EQ(FindOperaPluginDir(nullptr, 260), 0);
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
  const auto read = [&](char(&data)[260], DWORD count = 260) {
    return ReadRegistryValue(HKEY_LOCAL_MACHINE, key.c_str(), "Path", data, &count);
  };
  char data[260] = {};
  for (const std::string& good : {std::string(259, 'p'), std::string(259, 'p') + '\0'}) {
    SetRegistryText(key, "Path", good);
    EXPECT_EQ(read(data), 1);
    EXPECT_STREQ(data, good.c_str());
  }
  for (const std::string& bad : {std::string(260, 'p'), std::string(260, 'p') + '\0'}) {
    SetRegistryText(key, "Path", bad);
    EXPECT_EQ(read(data), 0);
  }
  DWORD count = sizeof(data);
  EXPECT_EQ(read(data, 0), 0);
  EXPECT_EQ(ReadRegistryValue(HKEY_LOCAL_MACHINE, "", "Path", data, &count), 0);
  EXPECT_EQ(ReadRegistryValue(HKEY_LOCAL_MACHINE, key.c_str(), "Path", nullptr, &count), 0);
  EXPECT_EQ(ReadRegistryValue(HKEY_LOCAL_MACHINE, key.c_str(), "Path", data, nullptr), 0);
}

}  // namespace

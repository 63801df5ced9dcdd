// Modules as the settings have them, and message boxes without a user.
#include <gtest/gtest.h>

#include "machine/open_objects.h"
#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

class System : public testing::Test {
 protected:
  void TearDown() override { EXPECT_EQ(machine::Stop(), ""); }

  TestMachine machine_;
};

TEST_F(System, ModulesAreThoseThatAreLoadedAndFunctionsThoseOfTheSystem) {
  char path[16];
  EXPECT_EQ(GetModuleFileNameA(nullptr, path, sizeof(path)), 0u);  // no program runs
  EXPECT_EQ(GetModuleHandleA("version.dll"), nullptr);
  const HMODULE version = LoadLibraryA("version.dll");
  EXPECT_EQ(GetModuleHandleA("version.dll"), version);
  EXPECT_EQ(machine::OpenObjects(), "1 module");
  FreeLibrary(version);
  EXPECT_EQ(GetProcAddress(version, "VerQueryValueA"), nullptr);

  machine::CurrentSettings().hasGetDiskFreeSpaceEx = false;
  EXPECT_EQ(GetProcAddress(GetModuleHandleA("kernel32"), "GetDiskFreeSpaceExA"), nullptr);
  machine::CurrentSettings().ntFamily = false;
  OSVERSIONINFOA info = {};
  info.dwOSVersionInfoSize = sizeof(info);
  EXPECT_EQ(GetVersionExA(&info), TRUE);
  EXPECT_EQ(info.dwPlatformId, VER_PLATFORM_WIN32_WINDOWS);
}

}  // namespace

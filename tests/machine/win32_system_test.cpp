// Modules, directories, memory blocks, strings and message boxes.
#include <gtest/gtest.h>

#include <cstring>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

class System : public testing::Test {
 protected:
  void TearDown() override { EXPECT_EQ(machine::Stop(), ""); }

  TestMachine machine_;
};

TEST_F(System, DirectoriesTellTheSizeTheyNeed) {
  char buffer[32];
  std::memset(buffer, 'x', sizeof(buffer));
  EXPECT_EQ(GetWindowsDirectoryA(buffer, 10), 11u);
  EXPECT_EQ(buffer[0], 'x');
  EXPECT_EQ(GetWindowsDirectoryA(buffer, 11), 10u);
  EXPECT_STREQ(buffer, "C:\\windows");
  EXPECT_EQ(GetSystemDirectoryA(nullptr, 0), 20u);
}

TEST_F(System, LibrariesAreLoadedByNameOrFromTheSystemDirectory) {
  for (const char* name : {"KERNEL32.DLL", "kernel32", "version.dll", "VERSION",
                           "c:\\WINDOWS\\system32\\Version.dll"}) {
    const HMODULE module = LoadLibraryA(name);
    EXPECT_NE(module, nullptr) << name;
    EXPECT_EQ(FreeLibrary(module), TRUE);
    EXPECT_EQ(FreeLibrary(module), FALSE);
  }
  for (const char* name : {"", "absent.dll", "C:\\version.dll", "C:\\windows\\version.dll"}) {
    EXPECT_EQ(LoadLibraryA(name), nullptr) << name;
  }
  EXPECT_EQ(FreeLibrary(nullptr), FALSE);
}

TEST_F(System, FunctionsAreFoundWhereTheyLive) {
  EXPECT_NE(GetModuleHandleA(nullptr), nullptr);
  const HMODULE kernel = GetModuleHandleA("KERNEL32.DLL");
  EXPECT_NE(GetProcAddress(kernel, "GetDiskFreeSpaceExA"), nullptr);
  EXPECT_EQ(GetProcAddress(kernel, "VerQueryValueA"), nullptr);
  EXPECT_EQ(GetProcAddress(kernel, reinterpret_cast<const char*>(uintptr_t{1})), nullptr);
  machine::CurrentSettings().hasGetDiskFreeSpaceEx = false;
  EXPECT_EQ(GetProcAddress(kernel, "GetDiskFreeSpaceExA"), nullptr);

  EXPECT_EQ(GetModuleHandleA("version.dll"), nullptr);
  const HMODULE version = LoadLibraryA("version.dll");
  EXPECT_EQ(GetModuleHandleA("version.dll"), version);
  for (const char* name : {"GetFileVersionInfoSizeA", "GetFileVersionInfoA", "VerQueryValueA"}) {
    EXPECT_NE(GetProcAddress(version, name), nullptr) << name;
  }
  EXPECT_EQ(GetProcAddress(version, "GetDiskFreeSpaceExA"), nullptr);
  FreeLibrary(version);
  EXPECT_EQ(GetProcAddress(version, "VerQueryValueA"), nullptr);
}

TEST_F(System, ImagePathIsCutToTheBuffer) {
  char buffer[16];
  EXPECT_EQ(GetModuleFileNameA(nullptr, buffer, sizeof(buffer)), 0u);
  machine_.Write("drive_c/a.exe", "x");
  machine_.Restart("drive_c/a.exe");
  EXPECT_EQ(GetModuleFileNameA(nullptr, buffer, sizeof(buffer)), 8u);
  EXPECT_STREQ(buffer, "C:\\a.exe");
  std::memset(buffer, 'x', sizeof(buffer));
  EXPECT_EQ(GetModuleFileNameA(nullptr, buffer, 8), 8u);
  EXPECT_EQ(std::string(buffer, 9), "C:\\a.exex");
}

TEST_F(System, VersionTellsTheFamily) {
  OSVERSIONINFOA info = {};
  EXPECT_EQ(GetVersionExA(&info), FALSE);
  static_assert(sizeof(info) == 148);
  info.dwOSVersionInfoSize = sizeof(info);
  EXPECT_EQ(GetVersionExA(&info), TRUE);
  EXPECT_EQ(info.dwPlatformId, VER_PLATFORM_WIN32_NT);
  machine::CurrentSettings().ntFamily = false;
  EXPECT_EQ(GetVersionExA(&info), TRUE);
  EXPECT_EQ(info.dwPlatformId, VER_PLATFORM_WIN32_WINDOWS);
}

TEST_F(System, MemoryBlocksAreLockedAndCounted) {
  const HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE, 16);
  void* bytes = GlobalLock(block);
  ASSERT_NE(bytes, nullptr);
  EXPECT_EQ(GlobalLock(block), bytes);
  EXPECT_EQ(GlobalUnlock(block), TRUE);
  EXPECT_EQ(GlobalUnlock(block), FALSE);
  EXPECT_EQ(GlobalFree(block), nullptr);
  EXPECT_EQ(GlobalFree(block), block);
  EXPECT_EQ(GlobalLock(block), nullptr);
  EXPECT_EQ(GlobalAlloc(GMEM_MOVEABLE, SIZE_MAX / 2), nullptr);
  const HGLOBAL leaked = GlobalAlloc(0, 4);
  EXPECT_EQ(GlobalLock(leaked), leaked);
  GlobalFree(leaked);
}

TEST_F(System, StringsAreCutToTheBufferAndAbsentOnesEmptyIt) {
  char buffer[32] = "before";
  EXPECT_EQ(LoadStringA(nullptr, 113, buffer, sizeof(buffer)), 22);
  EXPECT_STREQ(buffer, "C:\\Program Files\\Moriv");
  EXPECT_EQ(LoadStringA(nullptr, 113, buffer, 4), 3);
  EXPECT_STREQ(buffer, "C:\\");
  EXPECT_EQ(LoadStringA(nullptr, 112, buffer, sizeof(buffer)), 0);
  EXPECT_STREQ(buffer, "");
  std::strcpy(buffer, "before");
  EXPECT_EQ(LoadStringA(nullptr, 65535, buffer, sizeof(buffer)), 0);
  EXPECT_STREQ(buffer, "");
  EXPECT_EQ(LoadStringA(nullptr, 113, buffer, 0), 0);
}

TEST_F(System, BoxesArePrintedAndTakeTheirDefault) {
  constexpr UINT kYesNo = 4;
  constexpr UINT kSecondButton = 0x100;
  testing::internal::CaptureStdout();
  EXPECT_EQ(MessageBoxA(nullptr, "D\xE9j\xE0\r\nvu", "Moriv", MB_OK), 1);
  EXPECT_EQ(MessageBoxA(nullptr, "?", nullptr, kYesNo), 6);
  EXPECT_EQ(MessageBoxA(nullptr, nullptr, "", kYesNo | kSecondButton), 7);
  EXPECT_EQ(MessageBoxA(nullptr, "", "", MB_OK | kSecondButton), 1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "[Moriv]\nD\xC3\xA9j\xC3\xA0\nvu\n[Error]\n?\n[]\n\n[]\n\n");
}

}  // namespace

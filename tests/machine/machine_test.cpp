// Start and end of a machine, its faults, and the count of what is left open.
#include "machine/machine.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include "machine/faults.h"
#include "machine/open_objects.h"
#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

// The error, or "".
std::string Start(const TemporaryFolder& folder, const char* file = "") {
  std::string error;
  const bool isStarted = machine::Start(folder.Host(file), "", &error);
  EXPECT_EQ(isStarted, error.empty());
  return error;
}

TEST(Machine, PartsThatAreMissingAreMadeAndTheRestIsLeftAlone) {
  const TemporaryFolder folder;
  folder.Write("machine.ini", "[system]\nwindows = D:\\Caf\xC3\xA9\nsystem = Q:\\none\n");
  std::filesystem::create_directory(folder.Host("drive_d"));
  ASSERT_EQ(Start(folder), "");
  EXPECT_EQ(machine::CurrentSettings().windowsDirectory, "D:\\Caf\xE9");
  machine::Stop();
  EXPECT_TRUE(folder.Has("drive_d/Caf\xC3\xA9") && folder.Has("drive_c/Program Files"));
  EXPECT_FALSE(folder.Has("drive_c/windows"));

  // A machine that has run keeps what its programs removed removed.
  std::filesystem::remove(folder.Host("drive_c/Program Files"));
  ASSERT_EQ(Start(folder), "");
  machine::Stop();
  EXPECT_FALSE(folder.Has("drive_c/Program Files"));
}

TEST(Machine, UnusableFolderIsNamed) {
  const TemporaryFolder folder;
  const std::string settings = folder.Host("machine.ini");
  folder.Write("machine.ini", "[system]\nplatform = dos\n");
  EXPECT_TRUE(Start(folder, "machine.ini").starts_with(settings + ": "));
  EXPECT_TRUE(Start(folder).starts_with(settings + ":2: "));
  folder.Write("machine.ini", "");
  folder.Write("registry.reg", "REGEDIT4\n[HKEY_LOCAL_MACHINE\\A]\nb\n");
  EXPECT_NE(Start(folder).find("registry.reg:3: neither"), std::string::npos);
  EXPECT_EQ(GetFileAttributesA("C:\\"), INVALID_FILE_ATTRIBUTES);
  for (const char* part : {"machine.ini", "registry.reg"}) {
    const std::filesystem::path file = folder.Host(part);
    const std::string error = file.string() + ": is no plain file that can be read";
    std::filesystem::remove(file);
    ASSERT_EQ(mkfifo(file.c_str(), 0600), 0);
    EXPECT_EQ(Start(folder), error);
    for (const char* target : {"/dev/null", "nothing"}) {
      std::filesystem::remove(file);
      std::filesystem::create_symlink(target, file);
      EXPECT_EQ(Start(folder), error) << target;
    }
    std::filesystem::remove(file);
    std::filesystem::create_directory(file);
    EXPECT_EQ(Start(folder), error);
    std::filesystem::remove(file);
  }
}

TEST(Machine, StopTellsAndForgetsWhatIsOpen) {
  TestMachine pc;
  char path[16];
  EXPECT_EQ(GetModuleFileNameA(nullptr, path, sizeof(path)), 0u);  // no program runs
  for (const char* name : {"C:\\a", "C:\\b", "C:\\browser.exe"}) Create(name);
  _umask(_S_IWRITE);
  _creat("C:\\c", _S_IREAD | _S_IWRITE);
  const HMODULE version = LoadLibraryA("version.dll");
  char command[] = "C:\\browser.exe";
  STARTUPINFOA startup = {};
  PROCESS_INFORMATION process = {};
  for (const DWORD size : {DWORD{0}, DWORD{sizeof(startup)}}) {  // a record must tell its size
    startup.cb = size;
    EXPECT_EQ(CreateProcessA(nullptr, command, nullptr, nullptr, FALSE, 0, nullptr, nullptr,
                             &startup, &process) != FALSE,
              size != 0);
  }
  const HDC dc = CreateCompatibleDC(nullptr);
  const HBRUSH brush = CreateSolidBrush(0);
  const HGDIOBJ stock = SelectObject(dc, brush);
  EXPECT_FALSE(DeleteObject(brush));  // Windows forgives it for one that is selected
  EXPECT_EQ(machine::OpenObjects(),
            "3 files, 1 descriptor, 1 module, 1 brush, 1 device context, 2 process handles");
  SelectObject(dc, stock);
  EXPECT_TRUE(DeleteObject(brush) && DeleteDC(dc) && FreeLibrary(version));
  EXPECT_TRUE(CloseHandle(process.hProcess) && CloseHandle(process.hThread));
  EXPECT_EQ(GetModuleHandleA("version.dll"), nullptr);
  EXPECT_EQ(GetProcAddress(version, "VerQueryValueA"), nullptr);
  EXPECT_EQ(machine::Stop(), "3 files, 1 descriptor");
  pc.Restart();
  EXPECT_NE(Create("C:\\a"), INVALID_HANDLE_VALUE);
  EXPECT_EQ(_umask(0), 0);
  EXPECT_EQ(machine::Stop(), "1 file");
}

TEST(Faults, StrikeTheNthCallOnceOrFromThenOn) {
  TestMachine pc(
      "[faults]\nfail = CreateDirectoryA 2\nfail = RemoveDirectoryA 2 on\nfail = CloseHandle 1\n"
      "short = WriteFile 2\nfail = RegDeleteKeyA 1 87\n");
  std::string told;
  for (const char* name : {"C:\\a", "C:\\b", "C:\\b"})
    told += std::to_string(CreateDirectoryA(name, nullptr));
  for (const char* name : {"C:\\a", "C:\\b", "C:\\b"})
    told += std::to_string(RemoveDirectoryA(name));
  EXPECT_EQ(told, "101100");
  EXPECT_EQ(RegDeleteKeyA(HKEY_LOCAL_MACHINE, "x"), 87);

  // A close that fails has closed. A copy opens and closes its files by itself, uncounted.
  EXPECT_FALSE(CloseHandle(Create("C:\\file")));
  EXPECT_TRUE(CopyFileA("C:\\file", "C:\\copy", FALSE));
  EXPECT_EQ(machine::CallCount("CloseHandle"), 1);
  const HANDLE file = Create("C:\\file");
  DWORD done = 0;
  for (const DWORD expected : {5u, 2u, 5u}) {
    EXPECT_TRUE(WriteFile(file, "12345", 5, &done, nullptr));
    EXPECT_EQ(done, expected);
  }
  CloseHandle(file);
  EXPECT_EQ(pc.Read("drive_c/file"), "123451212345");
  EXPECT_EQ(machine::Stop(), "");
  EXPECT_EQ(machine::CallCount("CloseHandle"), 0);
}

}  // namespace

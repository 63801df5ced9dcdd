// Start and end of a machine, its faults, its disk space, the count of what is left open.
#include "machine/machine.h"

#include <gtest/gtest.h>

#include "machine/faults.h"
#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace fs = std::filesystem;

namespace {

HANDLE Create(const char* name) {
  return CreateFileA(name, GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
}

TEST(Machine, PartsThatAreMissingAreMadeAndTheRestIsLeftAlone) {
  const TemporaryFolder folder;
  fs::create_directories(folder.Path() / "drive_d");
  std::ofstream(folder.Path() / "machine.ini")
      << "[system]\nwindows = D:\\Caf\xC3\xA9\nsystem = Q:\\none\n";
  std::string error;
  ASSERT_TRUE(machine::Start(folder.Path(), "", &error)) << error;
  EXPECT_EQ(machine::CurrentSettings().windowsDirectory, "D:\\Caf\xE9");
  machine::Stop();
  EXPECT_TRUE(fs::exists(folder.Path() / "drive_d" / "Caf\xC3\xA9"));
  EXPECT_TRUE(fs::exists(folder.Path() / "drive_c" / "Program Files"));
  EXPECT_FALSE(fs::exists(folder.Path() / "drive_c" / "windows"));

  // A machine that has run keeps what its programs removed removed.
  fs::remove(folder.Path() / "drive_c" / "Program Files");
  ASSERT_TRUE(machine::Start(folder.Path(), "", &error)) << error;
  machine::Stop();
  EXPECT_FALSE(fs::exists(folder.Path() / "drive_c" / "Program Files"));
}

TEST(Machine, UnusableFolderIsNamed) {
  const TemporaryFolder folder;
  std::ofstream(folder.Path() / "file") << "x";
  std::ofstream(folder.Path() / "machine.ini") << "[system]\nplatform = dos\n";
  std::string error;
  EXPECT_FALSE(machine::Start(folder.Path() / "file", "", &error));
  EXPECT_TRUE(error.starts_with((folder.Path() / "file").string() + ": ")) << error;
  EXPECT_FALSE(machine::Start(folder.Path(), "", &error));
  EXPECT_TRUE(error.starts_with((folder.Path() / "machine.ini").string() + ":2: ")) << error;
  EXPECT_TRUE(machine::Folder().empty());
  EXPECT_EQ(GetFileAttributesA("C:\\"), INVALID_FILE_ATTRIBUTES);
}

TEST(Machine, StopTellsAndForgetsWhatIsOpen) {
  TestMachine pc;
  Create("C:\\a");
  Create("C:\\b");
  _sopen("C:\\windows\\..\\missing", _O_RDONLY, _SH_DENYNO);
  _umask(_S_IWRITE);
  _creat("C:\\c", _S_IREAD | _S_IWRITE);
  EXPECT_EQ(machine::Stop(), "2 files, 1 descriptor");
  pc.Restart();
  EXPECT_NE(Create("C:\\a"), INVALID_HANDLE_VALUE);
  EXPECT_EQ(_umask(0), 0);
  EXPECT_EQ(machine::Stop(), "1 file");
}

TEST(Faults, StrikeTheNthCallOnceOrFromThenOn) {
  TestMachine pc(
      "[faults]\nfail = CreateDirectoryA 2\nfail = RemoveDirectoryA 2 on\nfail = CloseHandle 1\n"
      "short = WriteFile 2\n");
  EXPECT_TRUE(CreateDirectoryA("C:\\a", nullptr));
  EXPECT_FALSE(CreateDirectoryA("C:\\b", nullptr));
  EXPECT_TRUE(CreateDirectoryA("C:\\b", nullptr));
  EXPECT_TRUE(RemoveDirectoryA("C:\\a"));
  EXPECT_FALSE(RemoveDirectoryA("C:\\b"));
  EXPECT_FALSE(RemoveDirectoryA("C:\\b"));
  EXPECT_EQ(machine::CallCount("CreateDirectoryA"), 3);

  // A close that fails has closed. A copy opens and closes its files by itself, uncounted.
  EXPECT_FALSE(CloseHandle(Create("C:\\file")));
  EXPECT_TRUE(CopyFileA("C:\\file", "C:\\copy", FALSE));
  EXPECT_EQ(machine::CallCount("CreateFileA"), 1);
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
}

TEST(DiskSpace, IsWhatTheSettingsTellPerDrive) {
  TestMachine pc("[disk C]\nfree = 12287\n[disk D]\nfree = 18446744073709551615\n");
  fs::create_directory(pc.Host("drive_d"));
  fs::create_directory(pc.Host("drive_e"));
  struct {
    const char* root;
    uint64_t bytes;
    DWORD clusters;
  } const rows[] = {{"C:", 12287, 2},
                    {"c:\\", 12287, 2},
                    {"D:\\", UINT64_MAX, UINT32_MAX},
                    {"E:", 10737418240, 2621440}};
  for (const auto& row : rows) {
    ULARGE_INTEGER toCaller, total, all;
    EXPECT_EQ(GetDiskFreeSpaceExA(row.root, &toCaller, &total, &all), 1) << row.root;
    EXPECT_EQ(toCaller.QuadPart, row.bytes) << row.root;
    DWORD sectors = 0, bytes = 0, clusters = 0, totalClusters = 0;
    EXPECT_TRUE(GetDiskFreeSpaceA(row.root, &sectors, &bytes, &clusters, &totalClusters));
    EXPECT_EQ(sectors * bytes, 4096u);
    EXPECT_EQ(clusters, row.clusters) << row.root;
  }
}

}  // namespace

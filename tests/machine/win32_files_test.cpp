// The Win32 file functions: what the machine's settings and its image change. What they do anywhere
// is in tests/contract/.
#include <gtest/gtest.h>

#include "machine/drives.h"
#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace fs = std::filesystem;

namespace {

constexpr DWORD kReadWrite = GENERIC_READ | GENERIC_WRITE;

HANDLE OpenExisting(const char* name, DWORD access = GENERIC_READ, DWORD share = 0) {
  return CreateFileA(name, access, share, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
}

HANDLE Create(const char* name, DWORD attributes = FILE_ATTRIBUTE_NORMAL) {
  return CreateFileA(name, kReadWrite, 0, nullptr, CREATE_ALWAYS, attributes, nullptr);
}

// Whether the open works; what it opened is closed again.
bool Opens(HANDLE handle) {
  return handle != INVALID_HANDLE_VALUE && CloseHandle(handle);
}

bool Write(HANDLE handle, const std::string& bytes) {
  DWORD done = 99;
  const BOOL written =
      WriteFile(handle, bytes.data(), static_cast<DWORD>(bytes.size()), &done, nullptr);
  EXPECT_EQ(done, written ? bytes.size() : 0);
  return written;
}

DWORD Seek(HANDLE handle, LONG distance, DWORD method) {
  return SetFilePointer(handle, distance, nullptr, method);
}

TEST(Files, FullDiskTakesAWriteWholeOrNotAtAll) {
  TestMachine pc("[disk c]\nwritable = 10\n");
  const HANDLE file = Create("C:\\a");
  EXPECT_TRUE(Write(file, "12345678"));
  EXPECT_FALSE(Write(file, "abc"));
  EXPECT_EQ(GetFileSize(file, nullptr), 8u);
  Seek(file, 6, FILE_BEGIN);
  EXPECT_TRUE(Write(file, "7890"));  // two bytes more
  EXPECT_FALSE(Write(file, "!"));
  Seek(file, 0, FILE_BEGIN);
  EXPECT_TRUE(Write(file, "1234567890"));  // over what is there
  EXPECT_FALSE(DeleteFileA("C:\\a"));
  CloseHandle(file);
  EXPECT_FALSE(CopyFileA("C:\\a", "C:\\b", FALSE));
  EXPECT_FALSE(pc.Has("drive_c/b"));

  EXPECT_TRUE(Opens(Create("C:\\a")));  // cut: ten bytes again
  EXPECT_EQ(*machine::CurrentSettings().disks['C'].writable, 10u);
  const HANDLE again = Create("C:\\b");
  EXPECT_TRUE(Write(again, "123456789"));
  Seek(again, 10, FILE_BEGIN);
  EXPECT_FALSE(Write(again, "z"));  // the gap counts too
  CloseHandle(again);
  EXPECT_TRUE(DeleteFileA("C:\\b"));
  EXPECT_EQ(*machine::CurrentSettings().disks['C'].writable, 10u);
}

TEST(Files, ReadOnlyDiskRefusesEveryChange) {
  TestMachine pc("[disk D]\nreadonly = 1\n");
  pc.Write("drive_d/dir/file", "x");
  fs::create_directory(pc.Host("drive_d/empty"));
  EXPECT_TRUE(Opens(OpenExisting("D:\\dir\\file")));
  EXPECT_EQ(OpenExisting("D:\\dir\\file", GENERIC_WRITE), INVALID_HANDLE_VALUE);
  EXPECT_EQ(Create("D:\\new"), INVALID_HANDLE_VALUE);
  EXPECT_FALSE(DeleteFileA("D:\\dir\\file"));
  EXPECT_FALSE(CopyFileA("D:\\dir\\file", "D:\\copy", FALSE));
  EXPECT_FALSE(CreateDirectoryA("D:\\new", nullptr));
  EXPECT_FALSE(RemoveDirectoryA("D:\\empty"));
  fs::create_directory(pc.Host("drive_e"));
  EXPECT_FALSE(RemoveDirectoryA("E:\\"));  // a root stays, empty or not
  EXPECT_EQ(_chmod("D:\\dir\\file", _S_IREAD), -1);
  EXPECT_TRUE(CopyFileA("D:\\dir\\file", "C:\\copy", FALSE));
}

TEST(Files, RunningImageCanBeReadOnly) {
  for (const std::string where : {"setup.exe", "drive_c/setup.exe"}) {
    for (const bool ntFamily : {true, false}) {
      SCOPED_TRACE(where + (ntFamily ? " nt" : " 9x"));
      TestMachine pc(ntFamily ? "" : "[system]\nplatform = 9x\n");
      pc.Write(where, "MZ");
      pc.Restart(where);
      const bool isOutside = where == "setup.exe";  // of the drives: the one file of a drive
      const char* const image = isOutside ? "Z:\\SETUP.exe" : "C:\\SETUP.exe";
      EXPECT_EQ(machine::ImagePath(), isOutside ? "Z:\\setup.exe" : "C:\\setup.exe");
      EXPECT_EQ(Opens(OpenExisting(image)), ntFamily);
      const int descriptor = _sopen(image, _O_RDONLY | _O_BINARY, _SH_DENYNO);
      EXPECT_GE(descriptor, 0);
      EXPECT_EQ(_close(descriptor), 0);
      EXPECT_EQ(_sopen(image, _O_WRONLY | _O_BINARY, _SH_DENYNO), -1);
      EXPECT_EQ(OpenExisting(image, GENERIC_WRITE, 3), INVALID_HANDLE_VALUE);
      EXPECT_EQ(Create(image), INVALID_HANDLE_VALUE);
      EXPECT_FALSE(DeleteFileA(image));
      EXPECT_TRUE(CopyFileA(image, "C:\\copy", FALSE));
      EXPECT_FALSE(CopyFileA("C:\\copy", image, FALSE));
      EXPECT_EQ(pc.Read(where), "MZ");
      if (!isOutside) continue;
      pc.Write("other.exe", "MZ");
      EXPECT_EQ(GetFileAttributesA("Z:\\other.exe"), INVALID_FILE_ATTRIBUTES);
      EXPECT_EQ(GetFileAttributesA("Z:\\setup.exe\\"), INVALID_FILE_ATTRIBUTES);
      EXPECT_EQ(GetFileAttributesA("Z:\\"), FILE_ATTRIBUTE_DIRECTORY);
      for (const char* name : {"Z:\\", "Z:\\new"}) {
        EXPECT_EQ(Create(name), INVALID_HANDLE_VALUE);
        EXPECT_FALSE(CreateDirectoryA(name, nullptr));
        EXPECT_FALSE(RemoveDirectoryA(name));
        EXPECT_FALSE(DeleteFileA(name));
      }
    }
  }
}

}  // namespace

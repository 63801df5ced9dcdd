// The Win32 file functions: what Windows refuses, and what it leaves behind.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "machine/open_objects.h"
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

std::string Read(HANDLE handle, DWORD count) {
  std::string bytes(count, '?');
  DWORD done = 99;
  if (!ReadFile(handle, bytes.data(), count, &done, nullptr)) return "failed";
  bytes.resize(done);
  return bytes;
}

DWORD Seek(HANDLE handle, LONG distance, DWORD method) {
  return SetFilePointer(handle, distance, nullptr, method);
}

void MakeReadOnly(const fs::path& file) {
  ASSERT_EQ(chmod(file.c_str(), 0444), 0);
}

TEST(Files, PositionsBehaveAtBothEnds) {
  TestMachine pc;
  const HANDLE file = Create("C:\\new.bin");
  ASSERT_NE(file, INVALID_HANDLE_VALUE);
  EXPECT_TRUE(Write(file, "abc"));
  EXPECT_EQ(Seek(file, -1, FILE_BEGIN), INVALID_SET_FILE_POINTER);
  EXPECT_EQ(Seek(file, -4, FILE_CURRENT), INVALID_SET_FILE_POINTER);
  EXPECT_EQ(Seek(file, 0, 3), INVALID_SET_FILE_POINTER);
  EXPECT_EQ(Seek(file, 0, FILE_CURRENT), 3u);
  EXPECT_EQ(Seek(file, 2, FILE_END), 5u);
  EXPECT_EQ(Read(file, 4), "");
  EXPECT_EQ(GetFileSize(file, nullptr), 3u);
  EXPECT_TRUE(Write(file, "z"));
  EXPECT_EQ(Seek(file, 1, FILE_BEGIN), 1u);
  EXPECT_EQ(Read(file, 100), std::string("bc\0\0z", 5));
  EXPECT_TRUE(CloseHandle(file));
  EXPECT_FALSE(CloseHandle(file));
  EXPECT_EQ(Read(file, 1), "failed");
}

TEST(Files, PositionsAboveTwoGigabytesFitWithoutAHighWordAboveFourDoNot) {
  TestMachine pc;
  const HANDLE file = Create("C:\\big.bin");
  EXPECT_EQ(Seek(file, INT32_MAX, FILE_BEGIN), 0x7FFFFFFFu);
  EXPECT_EQ(Seek(file, INT32_MAX, FILE_CURRENT), 0xFFFFFFFEu);
  EXPECT_EQ(Seek(file, 1, FILE_CURRENT), INVALID_SET_FILE_POINTER);
  LONG high = 1;
  EXPECT_EQ(SetFilePointer(file, 5, &high, FILE_BEGIN), 5u);
  EXPECT_EQ(high, 1);
  CloseHandle(file);
}

TEST(Files, AccessIsWhatWasAskedFor) {
  TestMachine pc;
  pc.Write("drive_c/a", "old");
  const HANDLE reader = OpenExisting("C:\\a", GENERIC_READ, 3);
  EXPECT_FALSE(Write(reader, "x"));
  EXPECT_EQ(Read(reader, 9), "old");
  CloseHandle(reader);
  const HANDLE writer = OpenExisting("C:\\a", GENERIC_WRITE);
  EXPECT_EQ(Read(writer, 1), "failed");
  EXPECT_TRUE(Write(writer, "N"));
  CloseHandle(writer);
  EXPECT_EQ(pc.Read("drive_c/a"), "Nld");
}

TEST(Files, WhatCannotBeOpenedOrMade) {
  TestMachine pc;
  pc.Write("drive_c/file", "x");
  for (const char* name : {"C:\\missing", "C:\\windows", "C:\\", "C:", "", "C:\\file\\x"}) {
    EXPECT_EQ(OpenExisting(name, GENERIC_WRITE), INVALID_HANDLE_VALUE) << name;
  }
  for (const char* name : {"C:\\windows", "C:\\", "", "C:\\no dir\\x", "C:\\file\\x", "C:\\new\\",
                           "C:\\nul", "C:\\a*b", "Q:\\x"}) {
    EXPECT_EQ(Create(name), INVALID_HANDLE_VALUE) << name;
  }
  EXPECT_FALSE(pc.Has("drive_c/missing"));
  EXPECT_EQ(OpenExisting(nullptr), INVALID_HANDLE_VALUE);
}

// Two opens of one file by share mode; the second under another spelling.
TEST(Files, SharingHoldsBetweenHandlesAndDescriptors) {
  constexpr DWORD kNone = 0, kShareRead = 1, kShareBoth = 3;
  struct {
    DWORD access, share;    // of the first
    DWORD access2, share2;  // of the second
    bool opens;
  } const rows[] = {
      {GENERIC_READ, kNone, GENERIC_READ, kShareBoth, false},
      {GENERIC_READ, kShareBoth, GENERIC_READ, kNone, false},
      {GENERIC_READ, kShareRead, GENERIC_READ, kShareRead, true},
      {GENERIC_READ, kShareRead, GENERIC_WRITE, kShareBoth, false},
      {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareRead, false},
      {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareBoth, true},
  };
  TestMachine pc;
  pc.Write("drive_c/file", "x");
  for (size_t i = 0; i < std::size(rows); ++i) {
    const auto& row = rows[i];
    const HANDLE first = OpenExisting("C:\\file", row.access, row.share);
    EXPECT_EQ(Opens(OpenExisting("c:/FILE", row.access2, row.share2)), row.opens) << "row " << i;
    EXPECT_TRUE(CloseHandle(first));
  }

  const HANDLE exclusive = OpenExisting("C:\\file");
  EXPECT_EQ(_sopen("C:\\file", _O_RDONLY | _O_BINARY, _SH_DENYNO), -1);
  EXPECT_EQ(_creat("C:\\file", _S_IREAD | _S_IWRITE), -1);
  CloseHandle(exclusive);
  const int descriptor = _sopen("C:\\file", _O_RDONLY | _O_BINARY, _SH_DENYNO);
  EXPECT_GE(descriptor, 0);
  EXPECT_EQ(OpenExisting("C:\\file"), INVALID_HANDLE_VALUE);
  EXPECT_TRUE(Opens(OpenExisting("C:\\file", GENERIC_READ, kShareBoth)));
  EXPECT_FALSE(DeleteFileA("C:\\file"));
  EXPECT_EQ(_close(descriptor), 0);
  EXPECT_TRUE(DeleteFileA("C:\\file"));
  EXPECT_EQ(machine::OpenObjects(), "");
}

TEST(Files, ReadOnlyAttributeRefusesWritingAndDeleting) {
  TestMachine pc;
  pc.Write("drive_c/fixed", "kept");
  MakeReadOnly(pc.Host("drive_c/fixed"));
  EXPECT_EQ(GetFileAttributesA("C:\\fixed"), FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY);
  EXPECT_TRUE(Opens(OpenExisting("C:\\fixed")));
  EXPECT_EQ(OpenExisting("C:\\fixed", GENERIC_WRITE), INVALID_HANDLE_VALUE);
  EXPECT_EQ(Create("C:\\fixed"), INVALID_HANDLE_VALUE);
  EXPECT_FALSE(DeleteFileA("C:\\fixed"));
  pc.Write("drive_c/other", "new");
  EXPECT_FALSE(CopyFileA("C:\\other", "C:\\fixed", FALSE));
  EXPECT_EQ(_creat("C:\\fixed", _S_IREAD | _S_IWRITE), -1);
  EXPECT_EQ(_sopen("C:\\fixed", _O_WRONLY | _O_BINARY, _SH_DENYNO), -1);
  EXPECT_EQ(pc.Read("drive_c/fixed"), "kept");

  EXPECT_TRUE(Opens(Create("C:\\made", FILE_ATTRIBUTE_READONLY)));
  EXPECT_FALSE(DeleteFileA("C:\\made"));
  EXPECT_EQ(_chmod("C:\\made", _S_IREAD | _S_IWRITE), 0);
  EXPECT_TRUE(DeleteFileA("C:\\made"));
}

TEST(Files, CreateCutsWhatIsThere) {
  TestMachine pc;
  pc.Write("drive_c/Old.Log", "long text");
  const HANDLE file = Create("C:\\OLD.log");
  EXPECT_TRUE(Write(file, "new"));
  CloseHandle(file);
  EXPECT_EQ(pc.Read("drive_c/Old.Log"), "new");
  EXPECT_FALSE(pc.Has("drive_c/OLD.log"));
}

TEST(Files, CopiesCarryBytesAndAttributes) {
  TestMachine pc;
  const std::string bytes(200000, 'b');
  pc.Write("drive_c/from.bin", bytes);
  pc.Write("drive_c/to.bin", "something else");
  EXPECT_FALSE(CopyFileA("C:\\from.bin", "C:\\to.bin", TRUE));
  EXPECT_EQ(pc.Read("drive_c/to.bin"), "something else");
  MakeReadOnly(pc.Host("drive_c/from.bin"));
  EXPECT_TRUE(CopyFileA("C:\\from.bin", "C:\\to.bin", FALSE));
  EXPECT_EQ(pc.Read("drive_c/to.bin"), bytes);
  EXPECT_TRUE(GetFileAttributesA("C:\\to.bin") & FILE_ATTRIBUTE_READONLY);

  pc.Write("drive_c/self", "whole");
  EXPECT_FALSE(CopyFileA("C:\\self", "C:\\SELF", FALSE));
  EXPECT_EQ(pc.Read("drive_c/self"), "whole");
  EXPECT_FALSE(CopyFileA("C:\\self", "C:\\windows", FALSE));
  EXPECT_FALSE(CopyFileA("C:\\windows", "C:\\copy", FALSE));
  EXPECT_FALSE(CopyFileA("C:\\missing", "C:\\copy", FALSE));
  EXPECT_FALSE(pc.Has("drive_c/copy"));
  EXPECT_EQ(machine::OpenObjects(), "");
}

TEST(Files, ProgramsCanBeStartedByTheHost) {
  TestMachine pc;
  pc.Write("drive_c/plain", "x");
  EXPECT_TRUE(CopyFileA("C:\\plain", "C:\\Copy.EXE", FALSE));
  EXPECT_TRUE(Opens(Create("C:\\made.exe")));
  EXPECT_TRUE(Opens(Create("C:\\made.dll")));
  const auto runnable = [&pc](const char* path) {
    return (fs::status(pc.Host(path)).permissions() & fs::perms::owner_exec) != fs::perms::none;
  };
  EXPECT_TRUE(runnable("drive_c/Copy.EXE"));
  EXPECT_TRUE(runnable("drive_c/made.exe"));
  EXPECT_FALSE(runnable("drive_c/made.dll"));
}

TEST(Files, DirectoriesComeOneByOneAndGoEmpty) {
  TestMachine pc;
  EXPECT_FALSE(CreateDirectoryA("C:\\a\\b", nullptr));
  EXPECT_TRUE(CreateDirectoryA("C:\\A", nullptr));
  EXPECT_FALSE(CreateDirectoryA("C:\\a", nullptr));
  EXPECT_TRUE(CreateDirectoryA("C:\\a\\b\\", nullptr));
  EXPECT_FALSE(CreateDirectoryA("C:", nullptr));
  EXPECT_FALSE(CreateDirectoryA("", nullptr));
  EXPECT_FALSE(CreateDirectoryA("C:\\aux", nullptr));
  EXPECT_EQ(GetFileAttributesA("C:\\a"), FILE_ATTRIBUTE_DIRECTORY);
  EXPECT_EQ(GetFileAttributesA("C:"), FILE_ATTRIBUTE_DIRECTORY);
  EXPECT_EQ(GetFileAttributesA("C:\\none"), INVALID_FILE_ATTRIBUTES);
  EXPECT_FALSE(RemoveDirectoryA("C:\\a"));
  pc.Write("drive_c/A/b/file", "x");
  EXPECT_FALSE(RemoveDirectoryA("C:\\a\\b\\file"));
  EXPECT_FALSE(RemoveDirectoryA("C:\\a\\b"));
  EXPECT_FALSE(DeleteFileA("C:\\a\\b"));
  EXPECT_TRUE(DeleteFileA("C:\\a\\b\\file"));
  EXPECT_TRUE(RemoveDirectoryA("C:\\a\\b"));
  EXPECT_TRUE(RemoveDirectoryA("C:\\a\\"));
  fs::create_directory(pc.Host("drive_e"));
  EXPECT_FALSE(RemoveDirectoryA("E:\\"));
  EXPECT_TRUE(pc.Has("drive_e"));
}

TEST(Files, NewDirectoryLeavesRoomForAFileName) {
  TestMachine pc;
  EXPECT_FALSE(CreateDirectoryA(("C:\\" + std::string(245, 'd')).c_str(), nullptr));
  EXPECT_TRUE(CreateDirectoryA(("C:\\" + std::string(244, 'd')).c_str(), nullptr));
  EXPECT_TRUE(Opens(Create(("C:\\" + std::string(249, 'f')).c_str())));
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
      const char* const image = where == "setup.exe" ? "Z:\\SETUP.exe" : "C:\\SETUP.exe";
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
    }
  }
}

TEST(Files, DriveOfTheImageTakesNothing) {
  TestMachine pc;
  pc.Write("setup.exe", "MZ");
  pc.Restart("setup.exe");
  EXPECT_EQ(GetFileAttributesA("Z:\\"), FILE_ATTRIBUTE_DIRECTORY);
  EXPECT_EQ(Create("Z:\\new"), INVALID_HANDLE_VALUE);
  EXPECT_EQ(Create("Z:\\"), INVALID_HANDLE_VALUE);
  EXPECT_FALSE(CreateDirectoryA("Z:\\dir", nullptr));
  EXPECT_FALSE(RemoveDirectoryA("Z:\\"));
  EXPECT_FALSE(DeleteFileA("Z:\\new"));
}

}  // namespace

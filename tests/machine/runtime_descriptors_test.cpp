// The descriptor layer: what the runtime does differently from the Win32 functions.
#include <gtest/gtest.h>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

constexpr int kPermission = _S_IREAD | _S_IWRITE;

TEST(Descriptors, TextModeAddsCarriageReturnsUntilSetToBinary) {
  TestMachine pc;
  const int file = _creat("C:\\a.txt", kPermission);
  ASSERT_GE(file, 0);
  EXPECT_EQ(_write(file, "a\nb\r\n", 5), 5);
  EXPECT_EQ(_tell(file), 7);
  _setmode(file, _O_BINARY);
  EXPECT_EQ(_setmode(file, _O_BINARY), _O_BINARY);
  EXPECT_EQ(_write(file, "c\n", 2), 2);
  EXPECT_EQ(_close(file), 0);
  EXPECT_EQ(pc.Read("drive_c/a.txt"), "a\r\nb\r\r\nc\n");

  const int binary = _sopen("C:\\a.txt", _O_WRONLY | _O_BINARY, _SH_DENYNO);
  EXPECT_EQ(_write(binary, "\n", 1), 1);
  EXPECT_EQ(_close(binary), 0);
  const int text = _sopen("C:\\a.txt", _O_WRONLY, _SH_DENYNO);
  _lseek(text, 0, 2);
  EXPECT_EQ(_write(text, "\n", 1), 1);
  EXPECT_EQ(_close(text), 0);
  EXPECT_EQ(pc.Read("drive_c/a.txt"), "\n\r\nb\r\r\nc\n\r\n");
}

TEST(Descriptors, MaskWithholdsPermissionsFromANewFile) {
  TestMachine pc;
  EXPECT_EQ(_umask(kPermission), 0);
  const int file = _creat("C:\\masked", kPermission);
  EXPECT_EQ(_umask(0), kPermission);
  EXPECT_TRUE(GetFileAttributesA("C:\\masked") & FILE_ATTRIBUTE_READONLY);
  EXPECT_EQ(_setmode(file, _O_BINARY), 0x4000);
  EXPECT_EQ(_write(file, "still", 5), 5);
  EXPECT_EQ(_lseek(file, 0, 0), 0);
  char back[8] = {};
  EXPECT_EQ(_read(file, back, sizeof back), 5);
  EXPECT_STREQ(back, "still");
  EXPECT_EQ(_chmod("C:\\masked", kPermission), 0);
  EXPECT_FALSE(GetFileAttributesA("C:\\masked") & FILE_ATTRIBUTE_READONLY);
  EXPECT_EQ(_close(file), 0);
  EXPECT_EQ(_chmod("C:\\missing", kPermission), -1);
}

TEST(Descriptors, PositionsStayWithinThirtyOneBits) {
  TestMachine pc;
  const int file = _creat("C:\\a", kPermission);
  EXPECT_EQ(_lseek(file, 10, 0), 10);
  EXPECT_EQ(_lseek(file, -11, 1), -1);
  EXPECT_EQ(_lseek(file, 0, 7), -1);
  EXPECT_EQ(_tell(file), 10);
  EXPECT_EQ(_lseek(file, INT32_MAX, 0), INT32_MAX);
  EXPECT_EQ(_lseek(file, 1, 1), -1);
  EXPECT_EQ(_close(file), 0);
  EXPECT_EQ(_close(file), -1);
  EXPECT_EQ(_tell(file), -1);
}

TEST(Descriptors, WhatCannotBeOpened) {
  TestMachine pc;
  EXPECT_EQ(_sopen("C:\\missing", _O_WRONLY | _O_BINARY, _SH_DENYNO), -1);
  EXPECT_EQ(_sopen("C:\\windows", _O_RDONLY | _O_BINARY, _SH_DENYNO), -1);
  EXPECT_EQ(_creat("C:\\windows", kPermission), -1);
  EXPECT_FALSE(pc.Has("drive_c/missing"));
  // A handle's number is no descriptor, nor the other way round.
  const HANDLE handle = CreateFileA("C:\\a", GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
  for (int number = 0; number < 64; ++number) EXPECT_EQ(_close(number), -1);
  EXPECT_TRUE(CloseHandle(handle));
}

TEST(Descriptors, StatTellsSizeAndKind) {
  TestMachine pc("[disk C]\nwritable = 5\n");
  pc.Write("drive_c/file", "12345");
  struct _stat status;
  EXPECT_EQ(_stat("C:\\FILE", &status), 0);
  EXPECT_EQ(status.st_size, 5);
  EXPECT_EQ(status.st_mode, 0x8000 | kPermission);
  EXPECT_EQ(_stat("C:\\windows", &status), 0);
  EXPECT_EQ(status.st_mode & 0xF000, 0x4000);
  EXPECT_LT(_stat("C:\\missing", &status), 0);

  const int file = _creat("C:\\new", kPermission);
  EXPECT_EQ(_write(file, "12\n45", 5), -1);  // six bytes in text mode
  EXPECT_EQ(_write(file, "12345", 5), 5);
  EXPECT_EQ(_close(file), 0);
}

}  // namespace

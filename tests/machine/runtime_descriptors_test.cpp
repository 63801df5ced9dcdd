// The descriptor layer beside the handles, and on a full disk. What it does anywhere is in
// tests/contract/.
#include <gtest/gtest.h>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

constexpr int kPermission = _S_IREAD | _S_IWRITE;

TEST(Descriptors, HandlesNumberIsNoDescriptor) {
  TestMachine pc;
  const HANDLE handle = CreateFileA("C:\\a", GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
  for (int number = 0; number < 64; ++number) EXPECT_EQ(_close(number), -1);
  EXPECT_TRUE(CloseHandle(handle));
}

TEST(Descriptors, CarriageReturnsTakeRoomOnTheDisk) {
  TestMachine pc("[disk C]\nwritable = 5\n");
  const int file = _creat("C:\\new", kPermission);
  EXPECT_EQ(_write(file, "12\n45", 5), -1);  // six bytes in text mode
  EXPECT_EQ(_write(file, "12345", 5), 5);
  EXPECT_EQ(_close(file), 0);
}

}  // namespace

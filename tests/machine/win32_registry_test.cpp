// The registry functions where this machine is stricter than Windows, and on the 9x family. What
// they do anywhere is in tests/contract/.
#include <gtest/gtest.h>

#include <string>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

const HKEY kRoot = HKEY_LOCAL_MACHINE;

class Registry : public testing::Test {
 protected:
  void TearDown() override { EXPECT_EQ(machine::Stop(), ""); }

  static HKEY Create(HKEY parent, const char* path, REGSAM access = KEY_ALL_ACCESS) {
    HKEY key = nullptr;
    EXPECT_EQ(RegCreateKeyExA(parent, path, 0, nullptr, 0, access, nullptr, &key, nullptr), 0)
        << path;
    return key;
  }

  // Status of an open that is closed again at once.
  static LSTATUS Open(HKEY parent, const char* path) {
    HKEY key = nullptr;
    const LSTATUS status = RegOpenKeyExA(parent, path, 0, KEY_READ, &key);
    EXPECT_EQ(key != nullptr, status == 0);
    if (status == 0) RegCloseKey(key);
    return status;
  }

  static LSTATUS Set(HKEY key, const char* name, const std::string& bytes) {
    return RegSetValueExA(key, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(bytes.data()),
                          static_cast<DWORD>(bytes.size()));
  }

  TestMachine machine_;
};

TEST_F(Registry, NothingStandsBehindATextStoredWithoutItsNul) {
  const HKEY key = Create(kRoot, "SOFTWARE\\A");
  ASSERT_EQ(Set(key, "v", "C:\\x"), 0);
  char data[8] = "before";
  DWORD size = sizeof(data);
  EXPECT_EQ(RegQueryValueExA(key, "v", nullptr, nullptr, reinterpret_cast<BYTE*>(data), &size), 0);
  EXPECT_EQ(size, 4u);
  EXPECT_STREQ(data, "C:\\xre");
  RegCloseKey(key);
}

TEST_F(Registry, NamesThatTheFileCannotHoldAreRefused) {
  const HKEY key = Create(kRoot, "SOFTWARE\\A");
  EXPECT_EQ(Set(key, "line\nbreak", ""), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(Open(kRoot, std::string(256, 'n').c_str()), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(RegDeleteKeyA(kRoot, ""), ERROR_ACCESS_DENIED);
  RegCloseKey(key);
}

TEST_F(Registry, OldFamilyDeletesSubkeysToo) {
  RegCloseKey(Create(kRoot, "SOFTWARE\\A\\B\\C"));
  EXPECT_EQ(RegDeleteKeyA(kRoot, "SOFTWARE\\A"), ERROR_ACCESS_DENIED);
  machine::CurrentSettings().ntFamily = false;
  EXPECT_EQ(Open(kRoot, "\\SOFTWARE\\A"), 0);
  EXPECT_EQ(RegDeleteKeyA(kRoot, "SOFTWARE\\A"), 0);
  EXPECT_EQ(Open(kRoot, "SOFTWARE\\A\\B"), ERROR_FILE_NOT_FOUND);
}

}  // namespace

// The registry functions: rights, sizes, and what Windows answers at the edges.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace {

constexpr LSTATUS kBadPathname = 161;
constexpr LSTATUS kKeyDeleted = 1018;
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

TEST_F(Registry, PathsAreMadeWholeAndFoundInAnyCase) {
  DWORD disposition = 0;
  HKEY key = nullptr;
  ASSERT_EQ(RegCreateKeyExA(kRoot, "Software\\Zeb\\Moriv\\", 0, nullptr, 0, KEY_READ, nullptr, &key,
                            &disposition),
            0);
  EXPECT_EQ(disposition, 1u);
  EXPECT_EQ(Open(key, nullptr), 0);
  EXPECT_EQ(Open(key, ""), 0);
  RegCloseKey(key);
  EXPECT_EQ(Open(kRoot, "SOFTWARE\\zEB\\MORIV"), 0);
  EXPECT_EQ(Open(kRoot, "SOFTWARE\\Zeb\\Moriv\\"), 0);
  EXPECT_EQ(Open(kRoot, "SOFTWARE\\Zeb\\Other"), ERROR_FILE_NOT_FOUND);
  EXPECT_EQ(Open(kRoot, "\\SOFTWARE"), kBadPathname);
  EXPECT_EQ(Open(kRoot, std::string(256, 'n').c_str()), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(Open(kRoot, ""), 0);
  EXPECT_NE(machine_.Read("registry.reg").find("[HKEY_LOCAL_MACHINE\\SOFTWARE\\Zeb\\Moriv]"),
            std::string::npos);

  machine::CurrentSettings().ntFamily = false;
  EXPECT_EQ(Open(kRoot, "\\SOFTWARE"), 0);
}

TEST_F(Registry, ClassesRootIsAKeyOfTheMachine) {
  RegCloseKey(Create(HKEY_CLASSES_ROOT, ".htm"));
  EXPECT_EQ(Open(kRoot, "SOFTWARE\\Classes\\.htm"), 0);
}

TEST_F(Registry, ValueSizesAreExact) {
  const HKEY key = Create(kRoot, "SOFTWARE\\A");
  ASSERT_EQ(Set(key, "v", "C:\\x"), 0);
  DWORD type = 0;
  DWORD size = 0;
  EXPECT_EQ(RegQueryValueExA(key, "V", nullptr, &type, nullptr, &size), 0);
  EXPECT_EQ(type, REG_SZ);
  EXPECT_EQ(size, 4u);

  BYTE data[8];
  std::memset(data, 0x55, sizeof(data));
  size = 3;
  EXPECT_EQ(RegQueryValueExA(key, "v", nullptr, nullptr, data, &size), ERROR_MORE_DATA);
  EXPECT_EQ(size, 4u);
  EXPECT_EQ(data[0], 0x55);

  size = sizeof(data);
  EXPECT_EQ(RegQueryValueExA(key, "v", nullptr, nullptr, data, &size), 0);
  EXPECT_EQ(size, 4u);
  EXPECT_EQ(std::string(data, data + 5), "C:\\x\x55");  // no NUL of the system's own

  EXPECT_EQ(RegSetValueExA(key, "v", 0, REG_EXPAND_SZ, nullptr, 0), 0);
  EXPECT_EQ(RegQueryValueExA(key, "v", nullptr, &type, data, &size), 0);
  EXPECT_EQ(size, 0u);
  EXPECT_EQ(type, REG_EXPAND_SZ);

  EXPECT_EQ(RegQueryValueExA(key, "v", nullptr, nullptr, data, nullptr), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(RegSetValueExA(key, "v", 0, REG_SZ, nullptr, 1), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(Set(key, "line\nbreak", ""), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(RegQueryValueExA(key, nullptr, nullptr, nullptr, nullptr, &size), ERROR_FILE_NOT_FOUND);
  EXPECT_EQ(Set(key, nullptr, "default"), 0);
  EXPECT_EQ(RegQueryValueExA(key, "", nullptr, nullptr, nullptr, &size), 0);
  RegCloseKey(key);
}

TEST_F(Registry, RightsAreThoseOfTheHandle) {
  RegCloseKey(Create(kRoot, "SOFTWARE\\A\\B"));
  const HKEY reader = Create(kRoot, "SOFTWARE\\A", KEY_READ);
  const HKEY writer = Create(kRoot, "SOFTWARE\\A", KEY_WRITE);
  char name[8];
  DWORD size = 0;
  EXPECT_EQ(Set(reader, "v", "x"), ERROR_ACCESS_DENIED);
  EXPECT_EQ(Set(writer, "v", "x"), 0);
  EXPECT_EQ(RegQueryValueExA(writer, "v", nullptr, nullptr, nullptr, &size), ERROR_ACCESS_DENIED);
  EXPECT_EQ(RegEnumKeyA(writer, 0, name, sizeof(name)), ERROR_ACCESS_DENIED);
  EXPECT_EQ(RegDeleteValueA(reader, "v"), ERROR_ACCESS_DENIED);
  EXPECT_EQ(RegQueryValueExA(reader, "v", nullptr, nullptr, nullptr, &size), 0);
  EXPECT_EQ(RegEnumKeyA(reader, 0, name, sizeof(name)), 0);
  EXPECT_EQ(RegDeleteValueA(writer, "v"), 0);
  EXPECT_EQ(RegDeleteValueA(writer, "v"), ERROR_FILE_NOT_FOUND);
  EXPECT_EQ(RegDeleteKeyA(reader, "B"), 0);  // goes by the key's own rights
  RegCloseKey(reader);
  RegCloseKey(writer);
}

TEST_F(Registry, SubkeysAreListedInTheOrderOfTheirMaking) {
  const HKEY key = Create(kRoot, "SOFTWARE\\A");
  for (const char* name : {"Zz", "Aa", "Mmmm"}) RegCloseKey(Create(key, name));
  char name[5] = "";
  EXPECT_EQ(RegEnumKeyA(key, 0, name, 3), 0);
  EXPECT_STREQ(name, "Zz");
  EXPECT_EQ(RegEnumKeyA(key, 2, name, 4), ERROR_MORE_DATA);
  EXPECT_EQ(RegEnumKeyA(key, 2, name, 5), 0);
  EXPECT_STREQ(name, "Mmmm");
  EXPECT_EQ(RegEnumKeyA(key, 3, name, 5), ERROR_NO_MORE_ITEMS);
  RegCloseKey(key);
}

TEST_F(Registry, KeyWithSubkeysGoesOnTheOldFamilyAlone) {
  RegCloseKey(Create(kRoot, "SOFTWARE\\A\\B\\C"));
  const HKEY inner = Create(kRoot, "SOFTWARE\\A\\B\\C");
  EXPECT_EQ(RegDeleteKeyA(kRoot, nullptr), ERROR_INVALID_PARAMETER);
  EXPECT_EQ(RegDeleteKeyA(kRoot, ""), ERROR_ACCESS_DENIED);
  EXPECT_EQ(RegDeleteKeyA(kRoot, "SOFTWARE\\A"), ERROR_ACCESS_DENIED);
  EXPECT_EQ(Open(kRoot, "SOFTWARE\\A\\B"), 0);
  machine::CurrentSettings().ntFamily = false;
  EXPECT_EQ(RegDeleteKeyA(kRoot, "SOFTWARE\\A"), 0);
  EXPECT_EQ(RegDeleteKeyA(kRoot, "SOFTWARE\\A"), ERROR_FILE_NOT_FOUND);

  // The handle outlives its key, and a key made anew is another one.
  RegCloseKey(Create(kRoot, "SOFTWARE\\A\\B\\C"));
  EXPECT_EQ(Set(inner, "v", "x"), kKeyDeleted);
  EXPECT_EQ(Open(inner, ""), kKeyDeleted);
  EXPECT_EQ(RegDeleteKeyA(inner, ""), kKeyDeleted);
  EXPECT_EQ(RegCloseKey(inner), 0);
}

TEST_F(Registry, HandlesAreChecked) {
  const HKEY key = Create(kRoot, "SOFTWARE");
  EXPECT_EQ(RegCloseKey(key), 0);
  EXPECT_EQ(RegCloseKey(key), ERROR_INVALID_HANDLE);
  EXPECT_EQ(Set(key, "v", "x"), ERROR_INVALID_HANDLE);
  EXPECT_EQ(Open(nullptr, "SOFTWARE"), ERROR_INVALID_HANDLE);
  EXPECT_EQ(RegCloseKey(kRoot), 0);
}

}  // namespace

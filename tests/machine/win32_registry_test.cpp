// The registry functions where this machine is stricter than Windows, and on the 9x family. What
// they do anywhere is in tests/contract/.
#include "tests/support/product_test.h"

namespace {

constexpr char kKey[] = "SOFTWARE\\A";

class Registry : public testing::Test {
 protected:
  void TearDown() override { EXPECT_EQ(machine::Stop(), ""); }

  TestMachine machine_;
};

TEST_F(Registry, NothingStandsBehindATextStoredWithoutItsNul) {
  SetRegistryText(kKey, "v", "C:\\x");
  RegistryKey key;
  ASSERT_TRUE(key.Open(HKEY_LOCAL_MACHINE, kKey, KEY_READ));
  char data[8] = "before";
  DWORD size = sizeof(data);
  EXPECT_EQ(
      RegQueryValueExA(key.get(), "v", nullptr, nullptr, reinterpret_cast<BYTE*>(data), &size), 0);
  EXPECT_EQ(size, 4u);
  EXPECT_STREQ(data, "C:\\xre");
}

TEST_F(Registry, NamesThatTheFileCannotHoldAreRefused) {
  RegistryKey key;
  ASSERT_TRUE(key.Create(HKEY_LOCAL_MACHINE, kKey));
  EXPECT_EQ(RegSetValueExA(key.get(), "line\nbreak", 0, REG_SZ, nullptr, 0),
            ERROR_INVALID_PARAMETER);
  EXPECT_FALSE(key.Create(HKEY_LOCAL_MACHINE, std::string(256, 'n').c_str()));
  EXPECT_EQ(RegDeleteKeyA(HKEY_LOCAL_MACHINE, ""), ERROR_ACCESS_DENIED);
}

TEST_F(Registry, OldFamilyDeletesSubkeysToo) {
  MakeRegistryKey("SOFTWARE\\A\\B\\C");
  EXPECT_EQ(RegDeleteKeyA(HKEY_LOCAL_MACHINE, kKey), ERROR_ACCESS_DENIED);
  machine::CurrentSettings().ntFamily = false;
  EXPECT_TRUE(HasRegistryKey("\\SOFTWARE\\A"));
  EXPECT_EQ(RegDeleteKeyA(HKEY_LOCAL_MACHINE, kKey), 0);
  EXPECT_FALSE(HasRegistryKey("SOFTWARE\\A\\B"));
}

}  // namespace

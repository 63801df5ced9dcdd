// The registry's file: what is written, what is read, what is refused; and the registry functions
// where this machine is stricter than Windows, and on the 9x family.
#include "machine/registry_text.h"
#include "tests/support/product_test.h"

namespace {

// What is written of a registry that was read from this text; the error if it can't be read.
std::string ReadAndWrite(const std::string& text) {
  const machine::RegistryRoots roots;
  std::string error;
  return machine::ReadRegistryText(text, roots, &error) ? machine::WriteRegistryText(roots) : error;
}

TEST(RegistryFile, ItsOwnFormComesBackByteForByte) {
  const std::string text = R"(REGEDIT4

[HKEY_LOCAL_MACHINE]
"AtTheRoot"=""

[HKEY_LOCAL_MACHINE\Zz]
@="first made, first written"
"b"="C:\\Program Files\\\"x\" ]"
"A \\ \""="d)"
                           "\xE9j\xE0"
                           R"("
"NoNul"=hex(1):43,3a
"Empty"=hex(1):
"TwoNuls"=hex(1):41,00,00
"Control"=hex(1):41,0a,00
"Expand"=hex(2):25,00
"Binary"=hex(3):00,ff
"Odd"=hex(ffffffff):01

[HKEY_LOCAL_MACHINE\Zz\Below]

[HKEY_LOCAL_MACHINE\Aa]

[HKEY_CURRENT_USER\Kept]
"x"="y"
)";
  EXPECT_EQ(ReadAndWrite(text), text);
}

TEST(RegistryFile, OtherFormsAreRead) {
  EXPECT_EQ(ReadAndWrite("REGEDIT4\r\n; a comment\r\n\r\n"
                         "[hkey_local_machine\\A\\B\\]\r\n"
                         "  \"Long\" = HEX:0A, fF,\\\r\n  00,\\\r\n  1  \r\n"
                         "\"Number\"=dword:0000010f\r\n"
                         "\"Text\"=hex(1):41,\\\r\n42,00\r\n"
                         "[HKEY_LOCAL_MACHINE\\a]\r\n@=\"one\"\r\n@=\"two\"\r\n"
                         "[HKEY_CLASSES_ROOT\\.htm]\r\n@=\"page\""),
            R"(REGEDIT4

[HKEY_LOCAL_MACHINE\A]
@="two"

[HKEY_LOCAL_MACHINE\A\B]
"Long"=hex(3):0a,ff,00,01
"Number"=hex(4):0f,01,00,00
"Text"="AB"

[HKEY_LOCAL_MACHINE\SOFTWARE]

[HKEY_LOCAL_MACHINE\SOFTWARE\Classes]

[HKEY_LOCAL_MACHINE\SOFTWARE\Classes\.htm]
@="page"
)");
}

TEST(RegistryFile, MistakesNameTheirLine) {
  std::string deep = "HKEY_LOCAL_MACHINE";
  for (int level = 0; level < 513; ++level) deep += "\\a";
  const std::string wide = "HKEY_LOCAL_MACHINE\\" + std::string(256, 'n');
  // The text behind the heading, and the error; a text in quotes stands in the third line.
  const std::pair<std::string, std::string> rows[] = {
      {"\n\"a\"=\"b\"", "3: a value in front of the first key"},
      {"[HKEY_LOCAL_MACHINE\\A", "2: a section without its closing bracket"},
      {"[HKEY_USERS\\A]", "2: an unknown root key: HKEY_USERS"},
      {"[-HKEY_LOCAL_MACHINE\\A]", "2: an unknown root key: -HKEY_LOCAL_MACHINE"},
      {"[" + deep + "]", "2: a bad key name: " + deep},
      {"[" + wide + "]", "2: a bad key name: " + wide},
      {"name=\"b\"", "3: neither a section nor a value"},
      {R"("a\n"="b")", "3: neither a section nor a value"},
      {"\"a\tb\"=\"b\"", "3: a bad value name"},
      {R"("a""b")", "3: a value without its equals sign"},
      {R"("a"="b)", "3: a text that is not well quoted"},
      {R"("a"="b\)", "3: a text that is not well quoted"},
      {R"("a"="b" c)", "3: a text that is not well quoted"},
      {R"("a"=-)", "3: data of an unknown form"},
      {R"("a"=hex(g):00)", "3: a bad value type"},
      {R"("a"=hex(123456789):00)", "3: a bad value type"},
      {R"("a"=hex:0g)", "3: a bad hexadecimal byte"},
      {R"("a"=hex:001)", "3: a bad hexadecimal byte"},
      {R"("a"=hex:00,)", "3: a comma without a byte behind it"},
      {"\"a\"=hex:00,\\\n  01,\\", "4: the file ends within a value"},
      {R"("a"=dword:)", "3: a bad dword"},
      {R"("a"=dword:123456789)", "3: a bad dword"},
  };
  for (const char* text : {"", "Windows Registry Editor Version 5.00\n"})
    EXPECT_EQ(ReadAndWrite(text), "1: the file does not begin with REGEDIT4");
  for (const auto& [text, error] : rows) {
    const bool isOfKey = error[0] != '2' && text[0] != '\n';
    const std::string key = isOfKey ? "[HKEY_LOCAL_MACHINE\\A]\n" : "";
    EXPECT_EQ(ReadAndWrite("REGEDIT4\n" + key + text + '\n'), error) << text;
  }
}

TEST(Registry, IsStricterThanWindowsAndLaxerOnTheOldFamily) {
  TestMachine pc;
  SetRegistryText("SOFTWARE\\A", "v", "C:\\x");
  MakeRegistryKey("SOFTWARE\\A\\B\\C");
  {
    RegistryKey key;
    ASSERT_TRUE(key.Open(HKEY_LOCAL_MACHINE, "SOFTWARE\\A", KEY_READ | KEY_WRITE));
    // Nothing stands behind a text stored without its NUL.
    char data[8] = "before";
    DWORD size = sizeof(data);
    EXPECT_EQ(
        RegQueryValueExA(key.get(), "v", nullptr, nullptr, reinterpret_cast<BYTE*>(data), &size),
        0);
    EXPECT_STREQ(data, "C:\\xre");
    // Names that the file can't hold.
    EXPECT_EQ(RegSetValueExA(key.get(), "line\nbreak", 0, REG_SZ, nullptr, 0),
              ERROR_INVALID_PARAMETER);
    EXPECT_FALSE(key.Create(HKEY_LOCAL_MACHINE, std::string(256, 'n').c_str()));
  }
  EXPECT_EQ(RegDeleteKeyA(HKEY_LOCAL_MACHINE, ""), ERROR_ACCESS_DENIED);
  machine::CurrentSettings().ntFamily = false;
  EXPECT_TRUE(RegistryKey().Open(HKEY_LOCAL_MACHINE, "\\SOFTWARE\\A", KEY_READ));
  EXPECT_EQ(RegDeleteKeyA(HKEY_LOCAL_MACHINE, "SOFTWARE\\A"), 0);
  EXPECT_FALSE(HasRegistryKey("SOFTWARE\\A"));
  pc.Restart();
  EXPECT_FALSE(HasRegistryKey("SOFTWARE\\A"));
  EXPECT_EQ(machine::Stop(), "");
}

}  // namespace

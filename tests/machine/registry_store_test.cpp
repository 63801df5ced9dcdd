// The registry's file: what is written, what is read, what is refused.
#include "machine/registry_store.h"

#include <gtest/gtest.h>

#include "machine/host_file.h"
#include "tests/support/test_machine.h"

namespace {

class RegistryFile : public testing::Test {
 protected:
  // Loads a file of this text. The error, or "".
  std::string Load(const std::string& text) {
    std::ofstream(File(), std::ios::binary) << text;
    std::string error;
    return machine::LoadRegistry(File(), &error) ? "" : error;
  }

  std::string Saved() {
    machine::SaveRegistry();
    const auto bytes = machine::ReadHostFile(File());
    return bytes ? std::string(bytes->begin(), bytes->end()) : "";
  }

  void TearDown() override { machine::CloseRegistry(); }

  std::filesystem::path File() const { return folder_.Path() / "registry.reg"; }

 private:
  TemporaryFolder folder_;
};

TEST_F(RegistryFile, ItsOwnFormComesBackByteForByte) {
  const std::string text =
      "REGEDIT4\n"
      "\n[HKEY_LOCAL_MACHINE]\n"
      "\"AtTheRoot\"=\"\"\n"
      "\n[HKEY_LOCAL_MACHINE\\Zz]\n"
      "@=\"first made, first written\"\n"
      "\"b\"=\"C:\\\\Program Files\\\\\\\"x\\\" ]\"\n"
      "\"A \\\\ \\\"\"=\"d\xE9j\xE0\"\n"
      "\"NoNul\"=hex(1):43,3a\n"
      "\"Empty\"=hex(1):\n"
      "\"TwoNuls\"=hex(1):41,00,00\n"
      "\"Control\"=hex(1):41,0a,00\n"
      "\"Expand\"=hex(2):25,00\n"
      "\"Binary\"=hex(3):00,ff\n"
      "\"Odd\"=hex(ffffffff):01\n"
      "\n[HKEY_LOCAL_MACHINE\\Zz\\Below]\n"
      "\n[HKEY_LOCAL_MACHINE\\Aa]\n"
      "\n[HKEY_CURRENT_USER\\Kept]\n"
      "\"x\"=\"y\"\n";
  ASSERT_EQ(Load(text), "");
  EXPECT_EQ(Saved(), text);
}

TEST_F(RegistryFile, OtherFormsAreRead) {
  ASSERT_EQ(Load("REGEDIT4\r\n; a comment\r\n\r\n"
                 "[hkey_local_machine\\A\\B\\]\r\n"
                 "  \"Long\" = HEX:0A, fF,\\\r\n  00,\\\r\n  1  \r\n"
                 "\"Number\"=dword:0000010f\r\n"
                 "\"Text\"=hex(1):41,\\\r\n42,00\r\n"
                 "[HKEY_LOCAL_MACHINE\\a]\r\n@=\"one\"\r\n@=\"two\"\r\n"
                 "[HKEY_CLASSES_ROOT\\.htm]\r\n@=\"page\""),
            "");
  EXPECT_EQ(Saved(),
            "REGEDIT4\n"
            "\n[HKEY_LOCAL_MACHINE\\A]\n@=\"two\"\n"
            "\n[HKEY_LOCAL_MACHINE\\A\\B]\n"
            "\"Long\"=hex(3):0a,ff,00,01\n"
            "\"Number\"=hex(4):0f,01,00,00\n"
            "\"Text\"=\"AB\"\n"
            "\n[HKEY_LOCAL_MACHINE\\SOFTWARE]\n"
            "\n[HKEY_LOCAL_MACHINE\\SOFTWARE\\Classes]\n"
            "\n[HKEY_LOCAL_MACHINE\\SOFTWARE\\Classes\\.htm]\n@=\"page\"\n");
}

TEST_F(RegistryFile, MistakesNameTheirLineAndChangeNothing) {
  const std::string key = "REGEDIT4\n[HKEY_LOCAL_MACHINE\\A]\n";
  const std::string deep = [] {
    std::string path;
    for (int level = 0; level < 513; ++level) path += "\\a";
    return path;
  }();
  const std::pair<std::string, std::string> rows[] = {
      {"", "1: the file does not begin with REGEDIT4"},
      {"Windows Registry Editor Version 5.00\n", "1: the file does not begin with REGEDIT4"},
      {"REGEDIT4\n\n\"a\"=\"b\"\n", "3: a value in front of the first key"},
      {"REGEDIT4\n[HKEY_LOCAL_MACHINE\\A\n", "2: a section without its closing bracket"},
      {"REGEDIT4\n[HKEY_USERS\\A]\n", "2: an unknown root key: HKEY_USERS"},
      {"REGEDIT4\n[-HKEY_LOCAL_MACHINE\\A]\n", "2: an unknown root key: -HKEY_LOCAL_MACHINE"},
      {"REGEDIT4\n[HKEY_LOCAL_MACHINE" + deep + "]\n",
       "2: a bad key name: HKEY_LOCAL_MACHINE" + deep},
      {"REGEDIT4\n[HKEY_LOCAL_MACHINE\\" + std::string(256, 'n') + "]\n",
       "2: a bad key name: HKEY_LOCAL_MACHINE\\" + std::string(256, 'n')},
      {key + "name=\"b\"\n", "3: neither a section nor a value"},
      {key + "\"a\\n\"=\"b\"\n", "3: neither a section nor a value"},
      {key + "\"a\tb\"=\"b\"\n", "3: a bad value name"},
      {key + "\"a\"\"b\"\n", "3: a value without its equals sign"},
      {key + "\"a\"=\"b\n", "3: a text that is not well quoted"},
      {key + "\"a\"=\"b\\\n", "3: a text that is not well quoted"},
      {key + "\"a\"=\"b\" c\n", "3: a text that is not well quoted"},
      {key + "\"a\"=-\n", "3: data of an unknown form"},
      {key + "\"a\"=hex(g):00\n", "3: a bad value type"},
      {key + "\"a\"=hex(123456789):00\n", "3: a bad value type"},
      {key + "\"a\"=hex:0g\n", "3: a bad hexadecimal byte"},
      {key + "\"a\"=hex:001\n", "3: a bad hexadecimal byte"},
      {key + "\"a\"=hex:00,\n", "3: a comma without a byte behind it"},
      {key + "\"a\"=hex:00,\\\n  01,\\\n", "4: the file ends within a value"},
      {key + "\"a\"=dword:\n", "3: a bad dword"},
      {key + "\"a\"=dword:123456789\n", "3: a bad dword"},
  };
  ASSERT_EQ(Load("REGEDIT4\n[HKEY_LOCAL_MACHINE\\Before]\n"), "");
  for (const auto& [text, error] : rows) EXPECT_EQ(Load(text), "registry.reg:" + error) << text;
  EXPECT_NE(machine::FindKey(machine::LocalMachine(), "before"), nullptr);
}

}  // namespace

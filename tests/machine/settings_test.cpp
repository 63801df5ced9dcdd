// machine.ini: every key, and every way to get one wrong.
#include "machine/settings.h"

#include <gtest/gtest.h>

#include "machine/seam_functions.h"
#include "tests/support/test_machine.h"

namespace {

using machine::Settings;

// Returns the error, "" for none.
std::string Parse(const std::string& text, Settings* settings) {
  const TemporaryFolder folder;
  std::ofstream(folder.Path() / "machine.ini") << text;
  std::string error;
  const bool read = machine::ReadSettings(folder.Path() / "machine.ini", settings, &error);
  EXPECT_EQ(read, error.empty());
  return error;
}

// What the rest of the keys does is seen in the scenarios.
TEST(Settings, FormsOfAValueAreRead) {
  Settings settings;
  ASSERT_EQ(Parse("; a comment\n"
                  "[system]\r\n"
                  "platform = 9x ; another\n"
                  "language = 0x040c\n"
                  "codepage = 1250\n"
                  "windows = D:\\Win Nt\n"
                  "now = 2000-02-29T23:59:58\n"
                  "[disk c]\nfree = 18446744073709551615\nwritable = 0\n"
                  "[faults]\n"
                  "fail = _write 2 on 112\n"
                  "fail = RegOpenKeyExA 1 2\n"
                  "short = ReadFile 7 on",
                  &settings),
            "");
  EXPECT_FALSE(settings.ntFamily);
  EXPECT_EQ(settings.language, 0x040C);
  EXPECT_EQ(settings.codePage, 1250);
  EXPECT_EQ(settings.windowsDirectory, "D:\\Win Nt");
  ASSERT_TRUE(settings.now.has_value());
  EXPECT_EQ(settings.now->wDay, 29);
  EXPECT_EQ(settings.now->wDayOfWeek, 2);
  EXPECT_EQ(settings.disks['C'].freeBytes, UINT64_MAX);
  EXPECT_EQ(settings.disks['C'].writable, 0u);
  ASSERT_EQ(settings.faults.size(), 3u);
  EXPECT_TRUE(settings.faults[0].fromThenOn);
  EXPECT_EQ(settings.faults[0].error, 112u);
  EXPECT_FALSE(settings.faults[1].fromThenOn);
  EXPECT_EQ(settings.faults[1].error, 2u);
  EXPECT_TRUE(settings.faults[2].isShort && settings.faults[2].fromThenOn);
}

TEST(Settings, MistakesNameTheirLineAndTheirKey) {
  struct {
    const char* text;
    const char* error;  // how it begins, behind the file's name
  } const rows[] = {
      {"\n[sytem]\nplatform = nt\n", ":3: unknown section [sytem]"},
      {"[system]\nplattform = nt\n", ":2: unknown key \"plattform\" in [system]"},
      {"[system]\n\nplatform = xp\n", ":3: [system] platform: \"xp\" is not nt or 9x"},
      {"platform = nt\n", ":1: unknown section []"},
      {"[system]\nlanguage = 0x10000\n", ":2: [system] language"},
      {"[system]\ncodepage = -1\n", ":2: [system] codepage"},
      {"[system]\nwindows = windows\n", ":2: [system] windows"},
      {"[system]\nnow = 2001-02-29T00:00:00\n", ":2: [system] now"},
      {"[system]\nnow = 2001-02-28T24:00:00\n", ":2: [system] now"},
      {"[system]\nnow = 2001-02-28 00:00:00\n", ":2: [system] now"},
      {"[disk]\nfree = 1\n", ":2: unknown section [disk]"},
      {"[disk C]\nfree = 1k\n", ":2: [disk C] free"},
      {"[disk C]\nwritable =\n", ":2: [disk C] writable"},
      {"[disk C]\nreadonly = yes\n", ":2: [disk C] readonly"},
      {"[api]\nCreateFileA = absent\n", ":2: unknown key"},
      {"[faults]\nfail = WriteFiles 1\n", ":2: [faults] fail: \"WriteFiles 1\""},
      {"[faults]\nfail = WriteFile\n", ":2: [faults] fail"},
      {"[faults]\nfail = WriteFile 0\n", ":2: [faults] fail"},
      {"[faults]\nfail = WriteFile 1 off\n", ":2: [faults] fail"},
      {"[faults]\nfail = WriteFile 1 on 5 5\n", ":2: [faults] fail"},
      {"[faults]\nshort = WriteFile 1 5\n", ":2: [faults] short"},
      {"[faults]\nshort = DeleteFileA 1\n", ":2: [faults] short"},
      {"[faults]\nstop = WriteFile 1 on\n", ":2: [faults] stop"},
      {"[system]\nnonsense\nplatform = xp\n", ":2: neither [SECTION] nor KEY = VALUE"},
      {"[system]\nplatform = xp\nnonsense\n", ":2: [system] platform"},
  };
  for (const auto& row : rows) {
    Settings settings;
    const std::string error = Parse(row.text, &settings);
    EXPECT_TRUE(error.starts_with(std::string("machine.ini") + row.error)) << error;
  }
  Settings settings;
  EXPECT_EQ(Parse("[system]\nwindows = C:\\" + std::string(3000, 'w'), &settings),
            "machine.ini:2: line too long");
  const std::string longest = "C:\\" + std::string(256, 'w');
  EXPECT_EQ(Parse("[system]\n  platform = 9x\n  windows = " + longest, &settings), "");
  EXPECT_EQ(settings.windowsDirectory, longest);
}

// The list of names must follow the header, or faults could not be set on a new function.
TEST(Settings, FaultsCanNameEveryFunctionOfTheSeam) {
  std::ifstream header(MORIV_SOURCE_DIR "/src/platform/win32.h");
  ASSERT_TRUE(header.is_open());
  std::string line;
  while (std::getline(header, line) && line != "extern \"C\" {") {
  }
  size_t declared = 0;
  while (std::getline(header, line)) {
    const size_t bracket = line.find('(');
    if (bracket == std::string::npos || line[0] == ' ' || line[0] == '/') continue;
    const size_t start = line.rfind(' ', bracket) + 1;
    const std::string name = line.substr(start, bracket - start);
    if (name == "WinMain") continue;
    EXPECT_TRUE(machine::IsSeamFunction(name)) << name;
    ++declared;
  }
  EXPECT_EQ(declared, std::size(machine::kSeamFunctions));
}

}  // namespace

// machine.ini: the forms of its values, and every way to get one wrong. What the keys do is seen in
// the scenarios.
#include "machine/settings.h"

#include <gtest/gtest.h>

#include "tests/support/test_machine.h"

namespace {

using machine::Settings;

// Returns the error behind the file's name, "" for none.
std::string Parse(const std::string& text, Settings* settings) {
  const TemporaryFolder folder;
  folder.Write("machine.ini", text);
  std::string error;
  const bool isRead = machine::ReadSettings(folder.Host("machine.ini"), settings, &error);
  EXPECT_EQ(isRead, error.empty());
  return error.empty() ? "" : error.substr(std::string("machine.ini:").size());
}

TEST(Settings, FormsOfAValueAreRead) {
  const std::string longest = "D:\\" + std::string(256, 'w');
  Settings settings;
  ASSERT_EQ(Parse("; a comment\n[system]\r\nplatform = 9x ; another\n  language = 0x040c\n"
                  "codepage = 1250\nwindows = " +
                      longest +
                      "\nnow = 2000-02-29T23:59:58\n"
                      "[disk c]\nfree = 18446744073709551615\nwritable = 0\n[faults]\n"
                      "fail = _write 2 on 112\nfail = RegOpenKeyExA 1 2\nshort = ReadFile 7 on",
                  &settings),
            "");
  EXPECT_FALSE(settings.ntFamily);
  EXPECT_EQ(settings.language, 0x040C);
  EXPECT_EQ(settings.codePage, 1250);
  EXPECT_EQ(settings.windowsDirectory, longest);
  ASSERT_TRUE(settings.now.has_value());
  EXPECT_EQ(settings.now->wDay * 10 + settings.now->wDayOfWeek, 292);
  EXPECT_EQ(settings.disks['C'].freeBytes, UINT64_MAX);
  EXPECT_EQ(settings.disks['C'].writable, 0u);
  std::string faults;
  for (const machine::Fault& fault : settings.faults) {
    faults += fault.function + ' ' + std::to_string(fault.call) +
              (fault.fromThenOn ? " on " : " ") +
              (fault.isShort ? "short" : std::to_string(fault.error)) + "; ";
  }
  EXPECT_EQ(faults, "_write 2 on 112; RegOpenKeyExA 1 2; ReadFile 7 on short; ");
}

TEST(Settings, MistakesNameTheirLineAndTheirKey) {
  const std::pair<std::string, std::string> rows[] = {
      // The whole text, and how the error begins.
      {"\n[sytem]\nplatform = nt\n", "3: unknown section [sytem]"},
      {"[system]\nplattform = nt\n", "2: unknown key \"plattform\" in [system]"},
      {"[system]\n\nplatform = xp\n", "3: [system] platform: \"xp\" is not nt or 9x"},
      {"platform = nt\n", "1: unknown section []"},
      {"[disk]\nfree = 1\n", "2: unknown section [disk]"},
      {"[disk 1]\nfree = 1\n", "2: unknown section [disk 1]"},
      {"[api]\nCreateFileA = absent\n", "2: unknown key"},
      {"[system]\nnonsense\nplatform = xp\n", "2: neither [SECTION] nor KEY = VALUE"},
      {"[system]\nplatform = xp\nnonsense\n", "2: [system] platform"},
      {"[system]\nwindows = C:\\" + std::string(3000, 'w'), "2: line too long"},
      {"[faults]\nfail = WriteFiles 1\n", "2: [faults] fail: \"WriteFiles 1\""},
  };
  const std::pair<std::string, std::string> values[] = {
      {"system", "language = 0x10000"},
      {"system", "codepage = -1"},
      {"system", "codepage = 65536"},
      {"system", "windows = windows"},
      {"system", "windows = C:\\" + std::string(257, 'w')},
      {"system", "now = 2001-02-29T00:00:00"},
      {"system", "now = 2001-02-28T24:00:00"},
      {"system", "now = 2001-02-28 00:00:00"},
      {"disk C", "free = 1k"},
      {"disk C", "writable ="},
      {"disk C", "readonly = yes"},
      {"faults", "fail = WriteFile"},
      {"faults", "fail = WriteFile 0"},
      {"faults", "fail = WriteFile 1 off"},
      {"faults", "fail = WriteFile 1 on 5 5"},
      {"faults", "short = WriteFile 1 5"},
      {"faults", "short = DeleteFileA 1"},
      {"faults", "stop = WriteFile 1 on"},
  };
  Settings settings;
  for (const auto& [text, error] : rows) {
    EXPECT_TRUE(Parse(text, &settings).starts_with(error)) << error;
  }
  for (const auto& [section, line] : values) {
    const std::string key = line.substr(0, line.find(' '));
    const std::string error = Parse("[" + section + "]\n" + line + "\n", &settings);
    EXPECT_TRUE(error.starts_with("2: [" + section + "] " + key + ": ")) << line << ": " << error;
  }
}

}  // namespace

// Version texts: each token counts as far as its digits go, whatever separates them, and a file's
// resource says what its text says; and version resources of hostile bytes, of a hostile
// executable.
//
//   0     what the rest is: a version text, a version resource or an executable
//   1...  the rest
#include <array>

#include "engine/file_version.h"
#include "machine/executable_resources.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"

namespace {

using Version = std::array<int16_t, 3>;
constexpr Version kNotSet = {kVersionNotSet, kVersionNotSet, kVersionNotSet};
constexpr char kFile[] = "drive_c/a.exe";

Version Parse(const std::string& text) {
  Version fields = {1, 2, 3};
  EXPECT_EQ(ParseVersionText(text.c_str(), fields.data()),
            text.empty() ? StatusNoVersion : StatusOk);
  EXPECT_EQ(std::ranges::count(fields, kVersionNotSet), text.empty() ? 3 : 0);
  return fields;
}

void CheckText(std::string text) {
  const Version version = Parse(text);
  if (!text.empty()) {  // a token ends with its digits, and with its 15th character
    EXPECT_EQ(Parse(text + 'x'), version);
    EXPECT_EQ(Parse(text + std::string(15, 'x') + '1'), version);
  }
  for (const char separator : {',', '-', ' '}) std::ranges::replace(text, separator, '.');
  EXPECT_EQ(Parse(text), version);
}

// What the program reads of the file at kFile.
Version ReadVersion() {
  FileRecord record;
  const int32_t isComplete = ReadFileRecordFromDisk("C:\\a.exe", &record);
  const Version version = {record.versionFirst, record.versionSecond, record.versionThird};
  EXPECT_EQ(std::ranges::count(version, kVersionNotSet), version == kNotSet ? 3 : 0);
  EXPECT_EQ(isComplete, version != kNotSet && record.versionLanguage[0] != '\0' ? 1 : 0);
  return version;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  std::string_view input = TextOf(data, size);
  const unsigned kind = TakeByte(&input) % 3;
  if (kind == 0) {
    const std::string text(input.substr(0, input.find('\0')));
    CheckText(text);
    pc.Write(kFile, PortableExecutable(size % 2 == 0, 16, 1,
                                       {{0x40C, VersionResource({{"FileVersion", text}})}}));
    if (text.size() < 20000) {  // a block tells its length in 16 bits
      EXPECT_EQ(ReadVersion(), Parse(text));
    }
    return 0;
  }

  const std::string bytes(input);
  pc.Write(kFile, kind == 1 ? PortableExecutable(false, 16, 1, {{0x40C, bytes}}) : bytes);
  (void)ReadVersion();
  const auto resource = machine::ReadVersionResource(pc.Host(kFile));
  if (!resource) return 0;
  for (const char* path : {"\\", "\\VarFileInfo", "\\StringFileInfo\\040c04b0\\ProductName"}) {
    const auto value = machine::QueryVersion(*resource, path);
    EXPECT_TRUE(!value || value->size() <= resource->size());
  }
  return 0;
}

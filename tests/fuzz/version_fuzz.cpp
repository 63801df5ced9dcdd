// Version texts against a second reading of their rules, and version resources: of the text, of
// hostile bytes, of a hostile executable.
//
//   0     what the rest is: a version text, a version resource or an executable
//   1...  the rest
#include <array>
#include <iterator>

#include "engine/file_version.h"
#include "machine/executable_resources.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"

namespace {

using Version = std::array<int16_t, 3>;
constexpr Version kNotSet = {kVersionNotSet, kVersionNotSet, kVersionNotSet};
constexpr char kFile[] = "drive_c/a.exe";

int16_t PlainNumber(std::string token) {
  token.resize(std::min<size_t>(token.size(), 15));
  return static_cast<int16_t>(std::strtoll(token.c_str(), nullptr, 10));
}

Version ParsePlainly(const std::string& text) {
  if (text.empty()) return kNotSet;
  Version version = kNotSet;
  std::string token;
  for (const char letter : text) {
    if (std::string_view(".,- ").find(letter) == std::string_view::npos) {
      token += letter;
      continue;
    }
    *std::find(version.begin(), version.end() - 1, kVersionNotSet) = PlainNumber(token);
    token.clear();
  }
  if (version[2] == kVersionNotSet) version[2] = PlainNumber(token);
  std::replace(version.begin(), version.end(), kVersionNotSet, int16_t{0});
  return version;
}

// What the program reads of the file at kFile.
Version ReadVersion() {
  FileRecord record;
  const int32_t isComplete = ReadFileRecordFromDisk("C:\\a.exe", &record);
  const Version version = {record.versionFirst, record.versionSecond, record.versionThird};
  const bool isSet = std::find(version.begin(), version.end(), kVersionNotSet) == version.end();
  EXPECT_EQ(isComplete, isSet && record.versionLanguage[0] != '\0' ? 1 : 0);
  EXPECT_TRUE(isSet || version == kNotSet);
  return version;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  FuzzInput input(data, size);
  const unsigned kind = input.TakeByte() % 3;
  if (kind == 0) {
    const std::string_view rest = input.rest();
    const std::string text(rest.substr(0, rest.find('\0')));
    Version fields = kNotSet;
    EXPECT_EQ(ParseVersionText(text.c_str(), fields.data()),
              text.empty() ? StatusNoVersion : StatusOk);
    EXPECT_EQ(fields, ParsePlainly(text));
    pc.Write(kFile, PortableExecutable(size % 2 == 0, 16, 1,
                                       {{0x40C, VersionResource({{"FileVersion", text}})}}));
    if (text.size() < 20000) {  // a block tells its length in 16 bits
      EXPECT_EQ(ReadVersion(), ParsePlainly(text));
    }
    return 0;
  }

  const std::string bytes(input.rest());
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

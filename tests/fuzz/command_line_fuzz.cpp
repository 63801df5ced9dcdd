// The command line against a second reading of its rules, on texts that grow at will.
#include <cstring>
#include <string>

#include "core/command_line.h"
#include "tests/fuzz/fuzz_target.h"

namespace {

struct PlainRequest {
  uint32_t options = 0;
  int32_t language = kLanguageNone;
  std::string installDir;
  std::string reportFile;
};

std::string Lower(std::string text) {
  for (char& letter : text) {
    if (letter >= 'A' && letter <= 'Z') letter = static_cast<char>(letter + ('a' - 'A'));
  }
  return text;
}

void ApplyPlainly(const std::string& option, PlainRequest* request) {
  static constexpr struct {
    const char* text;
    int32_t language;
  } kLanguages[] = {{"eng", kLanguageEnglish},
                    {"fra", kLanguageFrench},
                    {"ger", kLanguageGerman},
                    {"ita", kLanguageItalian},
                    {"spa", kLanguageSpanish}};
  const std::string lower = Lower(option);
  uint32_t& options = request->options;
  if (lower == "s") options = (options & ~OptionInteractive) | OptionSilent;
  if (lower == "i") options = (options & ~OptionSilent) | OptionInteractive;
  if (lower == "n") options = (options & ~OptionSilent) | OptionInteractive | OptionRegister;
  if (lower == "u") options |= OptionRemove;
  if (lower == "r") options |= OptionRegister;
  if (lower == "h" || lower == "?") options = OptionHelp;
  if (lower.starts_with("d:") && lower.size() > 2) request->installDir = option.substr(2);
  if (lower.starts_with("rf:") && lower.size() > 3) request->reportFile = option.substr(3);
  for (const auto& row : kLanguages) {
    if (lower == row.text) request->language = row.language;
  }
}

size_t FindMarker(const std::string& line, size_t from) {
  const size_t slash = line.find('/', from);
  return slash != std::string::npos ? slash : line.find('-', from);
}

bool ParsePlainly(const std::string& line, PlainRequest* request) {
  size_t marker = FindMarker(line, 0);
  if (marker == std::string::npos) return false;
  while (marker != std::string::npos && marker + 1 < line.size()) {
    const size_t start = marker + 1;
    marker = FindMarker(line, start);
    std::string option = line.substr(start, marker - start);
    if (option.size() >= kPathSize) continue;  // has no effect, before its blanks are cut
    while (option.size() > 1 && option.back() == ' ') option.pop_back();
    ApplyPlainly(option, request);
  }
  return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string line(data, std::find(data, data + size, 0));
  SetupRequest request = {};
  request.language = kLanguageNone;
  PlainRequest expected;
  EXPECT_EQ(ParseCommandLine(line.c_str(), &request), ParsePlainly(line, &expected) ? 1 : 0);
  EXPECT_EQ(request.options, expected.options);
  EXPECT_EQ(request.language, expected.language);
  EXPECT_NE(std::memchr(request.installDir, 0, sizeof(request.installDir)), nullptr);
  EXPECT_NE(std::memchr(request.reportFile, 0, sizeof(request.reportFile)), nullptr);
  EXPECT_EQ(request.installDir, expected.installDir);
  EXPECT_EQ(request.reportFile, expected.reportFile);
  EXPECT_EQ(request.productFound, 0);
  return 0;
}

// The command line, on texts that grow at will: what is taken stands in the line, and how the line
// is cut into options changes nothing else.
#include <cctype>
#include <cstring>
#include <tuple>

#include "core/command_line.h"
#include "tests/fuzz/fuzz_target.h"

namespace {

SetupRequest Parse(const std::string& line) {
  SetupRequest request = {};
  request.language = kLanguageNone;
  const bool hasMarker = line.find_first_of("/-") != std::string::npos;
  EXPECT_EQ(ParseCommandLine(line.c_str(), &request), hasMarker ? 1 : 0);
  return request;
}

std::string Lower(std::string text) {
  for (char& letter : text) letter = static_cast<char>(std::tolower(static_cast<uint8_t>(letter)));
  return text;
}

auto FieldsOf(const SetupRequest& request) {
  return std::make_tuple(request.options, request.language, Lower(request.installDir),
                         Lower(request.reportFile), request.productFound);
}

template <size_t N>
void ExpectFrom(const std::string& line, const std::string& prefix, const char (&field)[N]) {
  ASSERT_NE(std::memchr(field, 0, N), nullptr);
  const std::string value = field;
  if (value.empty()) return;
  EXPECT_NE(Lower(line).find(prefix + Lower(value)), std::string::npos);
  EXPECT_NE(line.find(value), std::string::npos);
  EXPECT_TRUE(value.find('/') == std::string::npos && value.back() != ' ');
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  std::string line(data, std::find(data, data + size, 0));
  const SetupRequest request = Parse(line);
  constexpr uint32_t kModes = OptionSilent | OptionInteractive;
  EXPECT_NE(request.options & kModes, kModes);
  EXPECT_EQ(request.options & ~(kModes | OptionRemove | OptionRegister | OptionHelp), 0u);
  EXPECT_TRUE(request.language == kLanguageNone || request.language % 10000 == 0);
  ExpectFrom(line, "d:", request.installDir);
  ExpectFrom(line, "rf:", request.reportFile);

  EXPECT_EQ(FieldsOf(Parse(Lower(line))), FieldsOf(request));
  EXPECT_EQ(FieldsOf(Parse("setup" + line)), FieldsOf(request));
  // A hyphen behind the last slash is as good as a slash.
  const size_t lastSlash = line.rfind('/');
  std::replace(line.begin() + static_cast<ptrdiff_t>(lastSlash + 1), line.end(), '-', '/');
  EXPECT_EQ(FieldsOf(Parse(line)), FieldsOf(request));
  // Options are taken one after the other.
  const size_t middle = line.find('/', line.size() / 2);
  if (middle == std::string::npos || line.find('-') != std::string::npos) return 0;
  SetupRequest inTwo = Parse(line.substr(0, middle));
  (void)ParseCommandLine(line.c_str() + middle, &inTwo);
  EXPECT_EQ(FieldsOf(inTwo), FieldsOf(request));
  return 0;
}

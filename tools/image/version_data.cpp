#include "tools/image/version_data.h"

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <iterator>
#include <optional>
#include <vector>

#include "engine/file_version.h"
#include "machine/executable_resources.h"
#include "tools/image/input_file.h"

namespace image {
namespace {

// The block that is read when a version resource has no translation.
constexpr char kUsualBlock[] = "040C04B0";

bool IsDigit(char c) {
  return c >= '0' && c <= '9';
}

std::string ReadTranslation(const std::vector<uint8_t>& resource) {
  const auto translation = machine::QueryVersion(resource, "\\VarFileInfo\\Translation");
  if (!translation || translation->size() < 4) return "";
  const std::vector<uint8_t>& pair = *translation;
  char digits[9];
  std::snprintf(digits, sizeof digits, "%02x%02x%02x%02x", pair[1], pair[0], pair[3], pair[2]);
  return digits;
}

}  // namespace

bool VersionData::IsComplete() const {
  return !language.empty() && std::none_of(std::begin(fields), std::end(fields),
                                           [](int16_t field) { return field == kVersionNotSet; });
}

VersionData ReadVersionData(const std::filesystem::path& file) {
  (void)InputFile(file);  // tells a file that can't be read from one without a version
  VersionData data;
  const auto resource = machine::ReadVersionResource(file);
  if (!resource) return data;
  data.language = ReadTranslation(*resource);
  const std::string block = data.language.empty() ? kUsualBlock : data.language;
  const auto text =
      machine::QueryVersion(*resource, "\\StringFileInfo\\" + block + "\\FileVersion");
  if (text) data.text.assign(text->begin(), text->end());
  // An empty text leaves the fields not set, which is all that its status says.
  (void)ParseVersionText(data.text.c_str(), data.fields);
  return data;
}

bool ParseVersion(std::string_view text, int16_t (&fields)[3]) {
  int16_t numbers[3] = {};
  const char* const end = text.data() + text.size();
  const char* next = text.data();
  for (int16_t& number : numbers) {
    if (&number != numbers && (next == end || *next++ != '.')) return false;
    if (next == end || !IsDigit(*next)) return false;  // or a sign would pass
    const auto [behind, error] = std::from_chars(next, end, number);
    if (error != std::errc()) return false;
    next = behind;
  }
  if (next != end) return false;
  std::ranges::copy(numbers, fields);
  return true;
}

std::optional<std::string> FindMisreadVersion(const VersionData& version) {
  if (version.text.empty()) return std::nullopt;
  std::string parts[3] = {"0", "0", "0"};
  const char* const end = version.text.data() + version.text.size();
  const char* next = version.text.data();
  for (std::string& part : parts) {
    next = std::find_if(next, end, IsDigit);
    const char* const behind = std::find_if_not(next, end, IsDigit);
    const char* const first = std::find_if(next, behind, [](char c) { return c != '0'; });
    if (first != behind) part.assign(first, behind);
    next = behind;
  }
  const std::string told = parts[0] + '.' + parts[1] + '.' + parts[2];
  if (told == DescribeVersion(version.fields)) return std::nullopt;
  return told;
}

std::string DescribeVersion(const int16_t (&fields)[3]) {
  return std::to_string(fields[0]) + '.' + std::to_string(fields[1]) + '.' +
         std::to_string(fields[2]);
}

}  // namespace image

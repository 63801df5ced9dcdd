#include "tools/image/version_data.h"

#include <algorithm>
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
  if (text) ParseVersion(std::string(text->begin(), text->end()), data.fields);
  return data;
}

void ParseVersion(const std::string& text, int16_t (&fields)[3]) {
  // An empty text leaves the fields not set, which is all that its status says.
  (void)ParseVersionText(text.c_str(), fields);
}

}  // namespace image

#include "tools/image/language_names.h"

#include <algorithm>
#include <iterator>

namespace image {
namespace {

struct Language {
  std::string_view name;
  int32_t offset;
};

constexpr Language kLanguages[] = {{"english", 0},     {"french", 10000},  {"german", 20000},
                                   {"italian", 30000}, {"spanish", 40000}, {"none", kNoLanguage}};

}  // namespace

std::optional<int32_t> FindLanguage(std::string_view text) {
  for (const Language& language : kLanguages) {
    if (text == language.name || text == std::to_string(language.offset)) return language.offset;
  }
  return std::nullopt;
}

bool IsLanguage(int64_t offset) {
  return std::any_of(std::begin(kLanguages), std::end(kLanguages),
                     [offset](const Language& language) { return language.offset == offset; });
}

std::string DescribeLanguage(int32_t offset) {
  for (const Language& language : kLanguages) {
    if (language.offset == offset) {
      return std::string(language.name) + " (" + std::to_string(offset) + ")";
    }
  }
  return std::to_string(offset);
}

}  // namespace image

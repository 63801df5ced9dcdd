#include "tools/image/make_rule.h"

#include <string_view>

namespace image {
namespace {

// A blank or # needs a backslash in front, and backslashes in front of that are then to be doubled.
// A colon behind a drive's letter make knows itself.
std::string Escaped(const std::filesystem::path& path) {
  const std::u8string text = path.generic_u8string();
  std::string escaped;
  size_t backslashes = 0;  // directly in front
  for (size_t at = 0; at < text.size(); ++at) {
    const char c = static_cast<char>(text[at]);
    const bool isDrive = at == 1 && text.size() > 2 && text[2] == '/';
    if (c == '$') escaped += '$';
    if (std::string_view(" \t#").find(c) != std::string_view::npos) {
      escaped.append(backslashes + 1, '\\');
    } else if ((c == ':' && !isDrive) || c == '%') {
      escaped += '\\';
    }
    backslashes = c == '\\' ? backslashes + 1 : 0;
    escaped += c;
  }
  return escaped;
}

}  // namespace

std::string MakeRule(const std::filesystem::path& target,
                     const std::vector<std::filesystem::path>& inputs) {
  std::string rule = Escaped(target) + ':';
  for (const std::filesystem::path& input : inputs) rule += " \\\n  " + Escaped(input);
  return rule + '\n';
}

}  // namespace image

#include "tools/image/toml_nesting.h"

#include <algorithm>
#include <string>

namespace image {
namespace {

// Offset behind a text in quotes that begins at `begin`. One in single or double quotes ends with
// its line at the latest, one in three of them where they come again.
size_t EndOfText(std::string_view toml, size_t begin) {
  const char quote = toml[begin];
  const std::string three(3, quote);
  const bool isLong = toml.substr(begin).starts_with(three);
  for (size_t at = begin + (isLong ? 3 : 1); at < toml.size(); ++at) {
    if (toml[at] == '\\' && quote == '"') {
      ++at;
    } else if (isLong ? toml.substr(at).starts_with(three) : toml[at] == quote) {
      return at + (isLong ? 3 : 1);
    } else if (!isLong && toml[at] == '\n') {
      return at;
    }
  }
  return toml.size();
}

}  // namespace

std::optional<int> FindDeepLine(std::string_view toml) {
  int open = 0;
  int points = 0;
  for (size_t at = 0; at < toml.size();) {
    const char c = toml[at];
    if (c == '"' || c == '\'') {
      at = EndOfText(toml, at);
      continue;
    }
    if (c == '#') {
      at = std::min(toml.find('\n', at), toml.size());
      continue;
    }
    if (c == '[' || c == '{') ++open;
    if ((c == ']' || c == '}') && open > 0) --open;
    if (c == '.') ++points;
    if (std::string_view("\n=,[{").find(c) != std::string_view::npos) points = 0;
    if (std::max(open, points) > kDeepestNesting) {
      return 1 + static_cast<int>(
                     std::count(toml.begin(), toml.begin() + static_cast<ptrdiff_t>(at), '\n'));
    }
    ++at;
  }
  return std::nullopt;
}

}  // namespace image

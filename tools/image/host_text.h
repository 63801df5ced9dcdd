// Paths of the host as text. All texts of the tools are UTF-8, on every host.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace image {

inline std::string TextOf(const std::filesystem::path& path) {
  const std::u8string text = path.u8string();
  return {text.begin(), text.end()};
}

inline std::filesystem::path PathOf(std::string_view utf8) {
  return std::u8string(utf8.begin(), utf8.end());
}

}  // namespace image

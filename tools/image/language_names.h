// The languages of the setup program by name and by their offset in its message catalog.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace image {

inline constexpr int32_t kNoLanguage = -1;
inline constexpr char kLanguageNames[] = "english, french, german, italian, spanish or none";

// Offset of a language given by name or by its number; nullopt for what is neither.
std::optional<int32_t> FindLanguage(std::string_view text);
bool IsLanguage(int64_t offset);
// "french (10000)"; the number alone when it is no language.
std::string DescribeLanguage(int32_t offset);

}  // namespace image

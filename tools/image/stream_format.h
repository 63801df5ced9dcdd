// The numbers that packer and reader of streams share.
#pragma once

#include <algorithm>
#include <bit>
#include <cstdint>

namespace image {

inline constexpr uint8_t kStreamMagic[3] = {'P', 'K', 'Z'};
inline constexpr uint32_t kShortestStream = 4;  // the magic and one byte; that of an empty file

inline constexpr uint32_t kWidenCode = 257;
inline constexpr uint32_t kResetCode = 258;
inline constexpr uint32_t kFirstFreeCode = 259;
inline constexpr unsigned kFirstWidth = 9;

// What packers keep to; a decoder takes wider codes and more entries.
inline constexpr unsigned kLastWidth = 15;
inline constexpr uint32_t kLastCode = (1u << kLastWidth) - 1;
// Codes behind which the decoder's next free code is kLastCode; the first makes no entry.
inline constexpr uint32_t kMostPhrases = kLastCode - kFirstFreeCode + 1;

// The width of the code that comes behind `count` codes that stand for strings: wider as soon as
// the decoder's next free code is the last that fits.
constexpr unsigned WidthBehind(uint32_t count) {
  const uint32_t nextFree = kFirstFreeCode + std::max(count, 1u) - 1;
  return std::clamp<unsigned>(static_cast<unsigned>(std::bit_width(nextFree + 1)), kFirstWidth,
                              kLastWidth);
}

// Positions and sizes of an image are signed 32-bit numbers to the setup program.
inline constexpr uint64_t kLargestSize = 0x7FFFFFFF;

}  // namespace image

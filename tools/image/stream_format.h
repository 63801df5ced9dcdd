// The numbers that packer and reader of streams share.
#pragma once

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

// Positions and sizes of an image are signed 32-bit numbers to the setup program.
inline constexpr uint64_t kLargestSize = 0x7FFFFFFF;

}  // namespace image

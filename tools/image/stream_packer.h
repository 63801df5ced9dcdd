// Packs a file's bytes into the stream that the setup program expands.
//
// A stream is "PKZ" and then LZW codes of 9 to 15 bits, most significant bit first, without gaps.
// Code 257 widens the codes behind it by one bit, code 258 empties the table and goes back to 9.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <span>
#include <vector>

namespace image {

// How a stream is made. Every choice gives a stream that any decoder of the format takes.
struct PackMethod {
  bool looksAhead;    // shorten a phrase where the next one then reaches further
  bool usesLiterals;  // of the first width, for stretches that would grow; never more than 1.126
                      // times the file then, and a few bytes
  bool plansLives;    // empty the table where that pays, not only when it is full
};

// Always the longest string that the table has: what the format's plainest packer does.
inline constexpr PackMethod kPackGreedily = {false, false, false};
inline constexpr PackMethod kPackFast = {true, true, false};
// The shortest, and about 10 times as slow.
inline constexpr PackMethod kPackBest = {true, true, true};

// The whole stream, its magic included; an empty file gives the magic and one zero byte, the
// shortest stream that an expander takes.
//
//   progress  called now and then with the bytes of the file that were taken since the last call
std::vector<uint8_t> PackStream(std::span<const uint8_t> file, const PackMethod& method,
                                const std::function<void(size_t)>& progress = nullptr);

}  // namespace image

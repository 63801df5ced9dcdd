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

class StreamPacker {
 public:
  // Called now and then with the bytes of the file that were taken since the last call.
  using Progress = std::function<void(size_t)>;

  StreamPacker();

  // The whole stream, its magic included; an empty file gives the magic and one zero byte, the
  // shortest stream that an expander takes.
  std::vector<uint8_t> Pack(std::span<const uint8_t> file, const Progress& progress = nullptr);

 private:
  struct Slot {
    uint32_t key;   // prefix code and byte of a table entry, kFreeSlot when there is none
    uint16_t code;  // of the entry
  };

  void Reset();
  Slot& FindSlot(uint32_t prefix, uint8_t byte);
  void PutCode(uint32_t code);
  void FollowDecoder();

  std::vector<uint8_t> stream_;
  std::vector<Slot> slots_;
  uint32_t pendingBits_ = 0;  // the last pendingCount_ bits are not yet in stream_
  unsigned pendingCount_ = 0;
  unsigned width_ = 0;
  uint32_t decoderNext_ = 0;  // the decoder's next free code, once it has read all that was put
  bool atStart_ = false;      // no code put since the start or the last reset
};

}  // namespace image

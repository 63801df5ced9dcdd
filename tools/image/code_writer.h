// Writes codes, each in the width that the decoder expects there.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "tools/image/stream_format.h"

namespace image {

// The width of codes behind the start or a reset. It grows as late as it can: in front of the first
// code that needs it.
class CodeWidth {
 public:
  unsigned Bits() const { return bits_; }
  bool Fits(uint32_t code) const { return code >> bits_ == 0; }
  void Widen() { ++bits_; }
  void Reset() { bits_ = kFirstWidth; }

  // The size in bits of `code` and of the codes in front of it that widen.
  uint32_t SizeWith(uint32_t code) {
    uint32_t size = 0;
    for (; !Fits(code); Widen()) size += bits_;
    return size + bits_;
  }

 private:
  unsigned bits_ = kFirstWidth;
};

class CodeWriter {
 public:
  void Put(uint32_t code) {
    for (; !width_.Fits(code); width_.Widen()) PutBits(kWidenCode);
    PutBits(code);
    if (code == kResetCode) width_.Reset();
  }

  // The size of the stream so far.
  uint64_t Bits() const { return uint64_t{stream_.size()} * 8 + pendingCount_; }

  // A place between two codes, to which the writer can return; what was put since is then gone.
  struct Mark {
    size_t bytes;
    uint32_t pendingBits;
    unsigned pendingCount;
    CodeWidth width;
  };
  Mark Here() const { return {stream_.size(), pendingBits_, pendingCount_, width_}; }
  void ReturnTo(const Mark& mark);

  // The stream, its last byte filled with zero bits.
  std::vector<uint8_t> Finish();

 private:
  void PutBits(uint32_t code) {
    pendingBits_ = pendingBits_ << width_.Bits() | code;
    pendingCount_ += width_.Bits();
    while (pendingCount_ >= 8) {
      pendingCount_ -= 8;
      stream_.push_back(static_cast<uint8_t>(pendingBits_ >> pendingCount_));
    }
  }

  std::vector<uint8_t> stream_{std::begin(kStreamMagic), std::end(kStreamMagic)};
  uint32_t pendingBits_ = 0;  // the last pendingCount_ bits are not yet in stream_
  unsigned pendingCount_ = 0;
  CodeWidth width_;
};

}  // namespace image

// Code sequences as a stream holds them, with the widths that the codes themselves make.
#pragma once

#include <cstdint>
#include <string>

class CodeStream {
 public:
  // Appends one code at the present width.
  CodeStream& Put(uint32_t code) {
    for (unsigned bit = width_; bit-- > 0;) {
      if (freeBits_ == 0) codes_ += '\0';
      freeBits_ = (freeBits_ + 7) % 8;
      codes_.back() |= static_cast<char>((code >> bit & 1) << freeBits_);
    }
    if (code == 257) ++width_;
    if (code == 258) width_ = 9;
    return *this;
  }

  CodeStream& PutTimes(uint32_t code, int times) {
    while (times-- > 0) Put(code);
    return *this;
  }

  unsigned width() const { return width_; }

  // The sequence, its last byte filled with zero bits.
  const std::string& Codes() const { return codes_; }
  std::string Stream() const { return "PKZ" + codes_; }

 private:
  std::string codes_;
  unsigned freeBits_ = 0;  // of the last byte
  unsigned width_ = 9;
};

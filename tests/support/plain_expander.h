// A slow and plain decoder of code sequences, to compare the program's with: it has the whole
// sequence at hand and keeps each entry of the table as a string of its own.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

struct PlainExpansion {
  std::string bytes;  // up to the fault, if there was one
  bool failed = false;
};

class PlainExpander {
 public:
  static PlainExpansion Expand(std::string_view codes) {
    PlainExpander expander(codes);
    while (expander.HasCode() && !expander.result_.failed) expander.Take(expander.NextCode());
    return expander.result_;
  }

 private:
  static constexpr uint64_t kEntryLimit = 35023;

  explicit PlainExpander(std::string_view codes) : codes_(codes) {}

  bool HasCode() const { return position_ + width_ <= 8 * codes_.size(); }

  uint64_t NextCode() {
    uint64_t code = 0;
    for (const size_t end = position_ + width_; position_ < end; ++position_) {
      const auto byte = static_cast<uint8_t>(codes_[position_ / 8]);
      code = code * 2 + (byte >> (7 - position_ % 8) & 1);
    }
    return code;
  }

  void Take(uint64_t code) {
    if (previous_.empty()) {  // at the start, or behind a reset
      if (code > 255) return Fail();
      return Emit(std::string(1, static_cast<char>(code)));
    }
    if (code == 257) {
      if (++width_ > 32) Fail();
      return;
    }
    if (code == 258) {
      table_.clear();
      previous_.clear();
      width_ = 9;
      return;
    }
    const uint64_t free = 259 + table_.size();
    std::string text;
    if (code < 256) {
      text = std::string(1, static_cast<char>(code));
    } else if (code == free) {
      text = previous_ + previous_[0];
    } else if (table_.count(code) != 0) {
      text = table_[code];
    }
    if (text.empty() || free >= kEntryLimit) return Fail();
    table_[free] = previous_ + text[0];
    Emit(text);
  }

  void Emit(const std::string& text) {
    result_.bytes += text;
    previous_ = text;
  }
  void Fail() { result_.failed = true; }

  std::string_view codes_;
  size_t position_ = 0;  // in bits
  unsigned width_ = 9;
  std::map<uint64_t, std::string> table_;
  std::string previous_;  // string of the code before; empty when there is none
  PlainExpansion result_;
};

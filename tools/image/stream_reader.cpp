#include "tools/image/stream_reader.h"

#include <algorithm>
#include <utility>

#include "tools/image/stream_format.h"

namespace image {
namespace {

constexpr unsigned kLargestWidth = 32;
constexpr size_t kTableSize = 35023;  // codes that have a place in the setup program's table
constexpr size_t kBlockSize = 65536;

}  // namespace

StreamReader::StreamReader(Source source)
    : source_(std::move(source)),
      block_(kBlockSize),
      width_(kFirstWidth),
      entries_(kTableSize),
      nextCode_(kFirstFreeCode) {}

std::span<const uint8_t> StreamReader::Next() {
  if (!magicSeen_) ReadMagic();
  while (fault_.empty()) {
    const std::optional<uint32_t> code = ReadCode();
    if (!code) return {};
    if (atStart_) return StartWith(*code);
    if (*code == kResetCode) {
      width_ = kFirstWidth;
      nextCode_ = kFirstFreeCode;
      atStart_ = true;
      continue;
    }
    if (*code == kWidenCode) {
      if (++width_ > kLargestWidth) return Fail("the codes become wider than 32 bits");
      continue;
    }
    if (*code == 256) return Fail("code 256 has no meaning");
    if (*code > nextCode_) {
      return Fail("code " + std::to_string(*code) + " is above the next free code " +
                  std::to_string(nextCode_));
    }
    BuildString(*code);
    if (nextCode_ >= kTableSize) return Fail("the table is full");
    entries_[nextCode_++] = {previousCode_, firstByte_};
    previousCode_ = *code;
    return string_;
  }
  return {};
}

std::optional<uint8_t> StreamReader::ReadByte() {
  if (blockUsed_ == blockFill_) {
    blockFill_ = source_(block_);
    blockUsed_ = 0;
    if (blockFill_ == 0) return std::nullopt;
  }
  return block_[blockUsed_++];
}

std::optional<uint32_t> StreamReader::ReadCode() {
  while (bitCount_ < width_) {
    const std::optional<uint8_t> byte = ReadByte();
    if (!byte) return std::nullopt;
    bits_ = bits_ << 8 | *byte;
    bitCount_ += 8;
  }
  bitCount_ -= width_;
  return static_cast<uint32_t>(bits_ >> bitCount_ & ((uint64_t{1} << width_) - 1));
}

void StreamReader::ReadMagic() {
  magicSeen_ = true;
  for (const uint8_t expected : kStreamMagic) {
    if (ReadByte() != expected) {
      Fail("the stream does not begin with \"PKZ\"");
      return;
    }
  }
  if (blockUsed_ < blockFill_) return;
  if (!ReadByte()) {
    Fail("the stream has nothing behind \"PKZ\"");
    return;
  }
  --blockUsed_;
}

std::span<const uint8_t> StreamReader::StartWith(uint32_t code) {
  if (code > 255) {
    return Fail("code " + std::to_string(code) + " stands where only a single byte can");
  }
  atStart_ = false;
  previousCode_ = code;
  firstByte_ = static_cast<uint8_t>(code);
  string_.assign(1, firstByte_);
  return string_;
}

// Puts the string of a code into string_ and its first byte into firstByte_. A prefix is always an
// older entry than the one that names it, so the chain ends at a byte.
void StreamReader::BuildString(uint32_t code) {
  string_.clear();
  if (code == nextCode_) {  // not yet in the table: the previous string and its own first byte
    string_.push_back(firstByte_);
    code = previousCode_;
  }
  for (; code > 255; code = entries_[code].prefix) string_.push_back(entries_[code].suffix);
  firstByte_ = static_cast<uint8_t>(code);
  string_.push_back(firstByte_);
  std::reverse(string_.begin(), string_.end());
}

std::span<const uint8_t> StreamReader::Fail(const std::string& fault) {
  fault_ = fault;
  return {};
}

}  // namespace image

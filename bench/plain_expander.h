// A plain decoder of the streams, step by step as the format is described: bits byte by byte, each
// string built backwards and handed on by itself, output collected in pieces of 1024 bytes. The
// program's expander is measured against it.
#pragma once

#include <cstdint>
#include <cstring>
#include <memory>

class PlainExpander {
 public:
  PlainExpander() = default;
  virtual ~PlainExpander() = default;
  PlainExpander(const PlainExpander&) = delete;
  PlainExpander& operator=(const PlainExpander&) = delete;

  int32_t failed() const { return failed_; }
  uint32_t bufferFill() const { return bufferFill_; }

  // Expands one block; the first begins with the magic.
  void ExpandBlock(const uint8_t* bytes, uint32_t count) {
    if (failed_ != 0) return;
    if (!magicSeen_) {
      magicSeen_ = true;
      if (count < 4 || memcmp(bytes, "PKZ", 3) != 0) {
        failed_ = 1;
        return;
      }
      bytes += 3;
      count -= 3;
    }
    input_ = bytes;
    inputLeft_ = count;
    while (failed_ == 0 && Step()) {
    }
  }

  // Writes what is collected.
  void Flush() {
    if (Write(buffer_, bufferFill_) < bufferFill_) failed_ = 1;
    bufferFill_ = 0;
  }

 protected:
  // Answers how many of the bytes the output took.
  virtual uint32_t Write(const uint8_t* bytes, uint32_t count) = 0;

 private:
  static constexpr uint32_t kTableSize = 35023;
  static constexpr uint32_t kBufferSize = 1024;

  struct Entry {
    uint32_t prefix;
    uint8_t suffix;
  };

  bool Step() {
    uint32_t code = 0;
    if (!ReadCode(&code)) return false;
    return isAtStart_ ? TakeFirstCode(code) : TakeNextCode(code);
  }

  bool ReadCode(uint32_t* code) {
    if (bitsWanted_ == 0) {
      codeValue_ = 0;
      bitsWanted_ = codeWidth_;
    }
    for (;;) {
      if (bitsInByte_ == 0) {
        if (inputLeft_ == 0) return false;
        currentByte_ = *input_++;
        --inputLeft_;
        bitsInByte_ = 8;
      }
      if (bitsInByte_ >= bitsWanted_) break;
      codeValue_ = (codeValue_ << bitsInByte_) | currentByte_;
      bitsWanted_ -= bitsInByte_;
      bitsInByte_ = 0;
    }
    bitsInByte_ -= bitsWanted_;
    codeValue_ = (codeValue_ << bitsWanted_) | (currentByte_ >> bitsInByte_);
    currentByte_ &= (1u << bitsInByte_) - 1;
    bitsWanted_ = 0;
    *code = codeValue_;
    return true;
  }

  bool Refuse() {
    failed_ = 1;
    return false;
  }

  bool TakeFirstCode(uint32_t code) {
    if (code > 255) return Refuse();
    isAtStart_ = false;
    firstByte_ = static_cast<uint8_t>(code);
    Push(firstByte_);
    return Emit(code);
  }

  bool TakeNextCode(uint32_t code) {
    if (code == 258) {
      nextCode_ = 259;
      codeWidth_ = 9;
      isAtStart_ = true;
      return true;
    }
    if (code == 257) return ++codeWidth_ <= 32 || Refuse();
    if (code > nextCode_ || code == 256) return Refuse();
    if (code == nextCode_) Push(firstByte_);
    BuildString(code == nextCode_ ? previousCode_ : code);
    firstByte_ = stringStack_[kTableSize - stringLength_];
    if (nextCode_ >= kTableSize) return Refuse();
    table_[nextCode_++] = {previousCode_, firstByte_};
    return Emit(code);
  }

  bool Emit(uint32_t code) {
    WriteOutput(stringStack_ + kTableSize - stringLength_, stringLength_);
    stringLength_ = 0;
    previousCode_ = code;
    return true;
  }

  void BuildString(uint32_t code) {
    for (; code > 255; code = table_[code].prefix) Push(table_[code].suffix);
    Push(static_cast<uint8_t>(code));
  }
  void Push(uint8_t byte) { stringStack_[kTableSize - ++stringLength_] = byte; }

  void WriteOutput(const uint8_t* bytes, uint32_t count) {
    while (bufferFill_ + count > kBufferSize) {
      const uint32_t taken = kBufferSize - bufferFill_;
      memcpy(buffer_ + bufferFill_, bytes, taken);
      bufferFill_ = kBufferSize;
      bytes += taken;
      count -= taken;
      Flush();
    }
    memcpy(buffer_ + bufferFill_, bytes, count);
    bufferFill_ += count;
  }

  int32_t failed_ = 0;
  int32_t bitsWanted_ = 0;
  uint32_t codeValue_ = 0;
  int32_t bitsInByte_ = 0;
  uint32_t currentByte_ = 0;
  const uint8_t* input_ = nullptr;
  uint32_t inputLeft_ = 0;
  bool isAtStart_ = true;  // or behind a reset
  int32_t codeWidth_ = 9;
  std::unique_ptr<Entry[]> table_ = std::make_unique<Entry[]>(kTableSize);
  uint8_t stringStack_[kTableSize];
  uint32_t stringLength_ = 0;
  uint32_t previousCode_ = 0;
  uint8_t firstByte_ = 0;
  uint32_t nextCode_ = 259;
  bool magicSeen_ = false;
  uint8_t buffer_[kBufferSize] = {};
  uint32_t bufferFill_ = 0;
};

#include "package/expander.h"

#include <bit>
#include <cstring>
#include <new>

#include "package/data_file.h"

namespace {

constexpr uint32_t kWindowSize = sizeof(uint32_t);
constexpr uint32_t kWindowBits = 8 * kWindowSize;
constexpr uint32_t kWidestInWindow = kWindowBits - 7;  // whatever bit of a byte the code begins at
constexpr uint32_t kMostBytes = UINT32_MAX / 16;       // so that bit positions have 32 bits

static_assert(std::endian::native == std::endian::little);

// The 32 bits of the stream that begin with the top bit of `bytes`.
uint32_t WindowAt(const uint8_t* bytes) {
  uint32_t window = 0;
  memcpy(&window, bytes, kWindowSize);
  return __builtin_bswap32(window);
}

}  // namespace

PkzExpander::PkzExpander() : table_(new (std::nothrow) StringTable::Entry[StringTable::kSize + 1]) {
  if (table_ == nullptr) return;
  strings_.entries = table_.get();
  strings_.SetLiterals();
}

void PkzExpander::Expand(const uint8_t* bytes, uint32_t count) {
  input_ = bytes;
  inputLeft_ = count;
  uint32_t code = 0;
  while (failed_ == 0 && ReadCode(&code)) {
    if (!TakeCode(code)) {
      GiveOut();
      Fail();
      return;
    }
    if (state_ == State::kNextCode) TakeStrings();
    if (batchFill_ > kBatchSize) GiveOut();
  }
  GiveOut();
}

bool PkzExpander::ReadCode(uint32_t* code) {
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

bool PkzExpander::TakeCode(uint32_t code) {
  uint8_t* const output = batch_ + batchFill_;
  uint8_t* end = output;
  if (state_ == State::kFirstCode) {
    if (code > UINT8_MAX) return false;
    end = strings_.AppendFirst(static_cast<uint8_t>(code), output);
    state_ = State::kNextCode;
  } else if (code == kResetCode) {
    codeWidth_ = kFirstWidth;
    state_ = State::kFirstCode;
  } else if (code == kWidenCode) {
    return ++codeWidth_ <= kLastWidth;
  } else if (strings_.Has(code) && strings_.FreeCount() > 0) {
    end = strings_.Append(code, output);
  } else {
    return false;
  }
  batchFill_ += static_cast<uint32_t>(end - output);
  return true;
}

// Takes codes out of 32-bit windows of the block, with all that changes in locals. It begins and
// ends between two codes. It ends in front of
//   - a code that stands for no string: TakeCode acts on it;
//   - a code whose window would reach beyond the block: ReadCode takes it byte by byte;
//   - a code that a full table can't take: TakeCode refuses it;
//   - a string that the batch has no room for: the batch is given out first.
void PkzExpander::TakeStrings() {
  // No bits are left over between blocks: a byte begun is of this block.
  const uint32_t begun = bitsInByte_ > 0 ? 1 : 0;
  const uint8_t* const bytes = input_ - begun;
  const uint32_t count = begun + (inputLeft_ < kMostBytes ? inputLeft_ : kMostBytes);
  const auto width = static_cast<uint32_t>(codeWidth_);
  if (width > kWidestInWindow || count < kWindowSize) return;

  // In bits. A code at lastPosition or before it lies in a window that ends with the last byte.
  uint32_t position = 8 * begun - static_cast<uint32_t>(bitsInByte_);
  const uint32_t lastPosition = 8 * (count - kWindowSize) + 7;

  StringTable strings = strings_;
  const uint32_t codesInBlock = (lastPosition - position) / width + 1;
  const uint32_t codesInTable = strings.FreeCount();
  const uint32_t endCode =
      strings.nextCode + (codesInBlock < codesInTable ? codesInBlock : codesInTable);
  uint8_t* output = batch_ + batchFill_;
  const uint8_t* const lastOutput = batch_ + kBatchSize;
  // Each round moves on by one code and one entry, so endCode bounds both `position` and the table.
  // Up to lastOutput there is room for any string.
  while (strings.nextCode < endCode && output <= lastOutput) {
    const uint32_t window = WindowAt(bytes + position / 8);
    const uint32_t code = (window << position % 8) >> (kWindowBits - width);
    if (!strings.Has(code)) break;
    output = strings.Append(code, output);
    position += width;
  }
  strings_ = strings;
  batchFill_ = static_cast<uint32_t>(output - batch_);

  const uint32_t taken = (position + 7) / 8;
  bitsInByte_ = static_cast<int32_t>(8 * taken - position);
  currentByte_ = bitsInByte_ > 0 ? bytes[taken - 1] & ((1u << bitsInByte_) - 1) : 0;
  input_ = bytes + taken;
  inputLeft_ -= taken - begun;
}

// The string that made the batch too long is given out by itself. What is in front of it has at
// most 1024 bytes and so makes at most one write of that size: when it fails, none of a later
// string follows.
void PkzExpander::GiveOut() {
  const uint32_t fill = batchFill_;
  const uint32_t last = fill > kBatchSize ? strings_.LastLength() : 0;
  batchFill_ = 0;
  if (fill > last) WriteOutput(batch_, fill - last);
  if (last > 0 && failed_ == 0) WriteOutput(batch_ + fill - last, last);
}

void PkzFileExpander::ExpandBlock(const uint8_t* bytes, uint32_t count) {
  if (failed() != 0) return;
  if (bytes == nullptr) {
    Fail();
    return;
  }
  if (magicSeen_) {
    Expand(bytes, count);
    return;
  }
  magicSeen_ = true;
  if (count <= kStreamMagicSize || memcmp(bytes, kStreamMagic, kStreamMagicSize) != 0) {
    Fail();
    return;
  }
  Expand(bytes + kStreamMagicSize, count - kStreamMagicSize);
}

void PkzFileExpander::WriteOutput(const uint8_t* bytes, uint32_t count) {
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

void PkzFileExpander::Flush() {
  if (output_ != nullptr && output_->Write(buffer_, bufferFill_) < bufferFill_) Fail();
  bufferFill_ = 0;
}

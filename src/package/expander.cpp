#include "package/expander.h"

#include <cstring>
#include <new>

#include "package/data_file.h"

PkzExpander::PkzExpander() : table_(new (std::nothrow) Entry[kTableSize]) {}

PkzExpander::~PkzExpander() {
  delete[] table_;
}

void PkzExpander::Expand(const uint8_t* bytes, uint32_t count) {
  if (failed_ != 0) return;
  input_ = bytes;
  inputLeft_ = count;
  while (Step()) {
  }
}

bool PkzExpander::Step() {
  switch (state_) {
    case State::kFirstCode:
      return ReadFirstCode();
    case State::kNextCode:
      return ReadNextCode();
    case State::kFirstCodeAfterReset:
      return ReadFirstCode() && Emit();
    case State::kEmit:
      return Emit();
  }
  return false;
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

bool PkzExpander::ReadFirstCode() {
  uint32_t code = 0;
  if (!ReadCode(&code)) return false;
  if (code > 255) {
    Fail();
    return false;
  }
  PushByte(static_cast<uint8_t>(code));
  previousCode_ = code;
  firstByte_ = code;
  state_ = State::kEmit;
  return true;
}

bool PkzExpander::ReadNextCode() {
  uint32_t code = 0;
  if (!ReadCode(&code)) return false;
  if (code == kResetCode) {
    ResetCodes();
    state_ = State::kFirstCodeAfterReset;
    return true;
  }
  if (code == kWidenCode) {
    if (codeWidth_ == kLastWidth) Fail();
    ++codeWidth_;
    return failed_ == 0;
  }

  // Compared unsigned: as a signed number a 32-bit code with its top bit set would look like a
  // literal. 256 has no meaning and no entry.
  const uint32_t nextCode = static_cast<uint32_t>(nextCode_);
  if (code > nextCode || code == 256) {
    Fail();
    return false;
  }
  if (code == nextCode) {
    // The entry that this very code makes: the previous string and its own first byte.
    PushByte(static_cast<uint8_t>(firstByte_));
    BuildString(previousCode_);
  } else {
    BuildString(code);
  }
  firstByte_ = stringStack_[kTableSize - stringLength_];

  if (nextCode_ >= kTableSize) {
    Fail();
    return false;
  }
  table_[nextCode_++] = {previousCode_, static_cast<uint8_t>(firstByte_)};
  previousCode_ = code;
  state_ = State::kEmit;
  return true;
}

bool PkzExpander::Emit() {
  WriteOutput(stringStack_ + kTableSize - stringLength_, static_cast<uint32_t>(stringLength_));
  stringLength_ = 0;
  state_ = State::kNextCode;
  return failed_ == 0;
}

void PkzExpander::ResetCodes() {
  nextCode_ = kFirstEntry;
  codeWidth_ = kFirstWidth;
}

// A prefix is always older than the entry that names it, so a chain shrinks and ends at a literal.
// The longest string: 34764 entries (259 to 35022), 1 literal and 1 byte for a code equal to
// nextCode make 34766, below the 35023 bytes of the stack.
void PkzExpander::PushByte(uint8_t value) {
  stringStack_[kTableSize - ++stringLength_] = value;
}

void PkzExpander::BuildString(uint32_t code) {
  while (code > 255) {
    PushByte(table_[code].suffix);
    code = table_[code].prefix;
  }
  PushByte(static_cast<uint8_t>(code));
}

void PkzFileExpander::ExpandBlock(const uint8_t* bytes, uint32_t count) {
  if (failed() != 0) return;
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

// Greedy LZW: the longest string of the table that the rest of the file begins with, then the table
// gets that string and the byte behind it.
//
// The packer's newest entry is one that the decoder makes only with the next code. So it may be put
// at once: it is then the decoder's next free code, which the decoder knows how to read.

#include "tools/image/stream_packer.h"

#include "tools/image/stream_format.h"

namespace image {
namespace {

constexpr unsigned kLastWidth = 15;
constexpr uint32_t kFreeSlot = 0xFFFFFFFF;
// The table never holds more than 32767 - 259 entries, so half of the slots stay free and each
// search ends soon.
constexpr uint32_t kSlotBits = 16;
constexpr uint32_t kSlotCount = 1u << kSlotBits;
constexpr size_t kProgressStep = 65536;

}  // namespace

StreamPacker::StreamPacker() : slots_(kSlotCount) {}

std::vector<uint8_t> StreamPacker::Pack(std::span<const uint8_t> file, const Progress& progress) {
  stream_.assign(std::begin(kStreamMagic), std::end(kStreamMagic));
  if (file.empty()) return {'P', 'K', 'Z', 0};
  pendingCount_ = 0;
  Reset();

  uint32_t match = file[0];
  for (size_t i = 1; i < file.size(); ++i) {
    if (progress && i % kProgressStep == 0) progress(kProgressStep);
    Slot& slot = FindSlot(match, file[i]);
    if (slot.key != kFreeSlot) {
      match = slot.code;
      continue;
    }
    PutCode(match);
    slot = {match << 8 | file[i], static_cast<uint16_t>(decoderNext_)};
    FollowDecoder();
    match = file[i];
  }
  PutCode(match);
  if (progress) progress((file.size() - 1) % kProgressStep + 1);
  if (pendingCount_ > 0)
    stream_.push_back(static_cast<uint8_t>(pendingBits_ << (8 - pendingCount_)));
  return std::move(stream_);
}

void StreamPacker::Reset() {
  std::fill(slots_.begin(), slots_.end(), Slot{kFreeSlot, 0});
  width_ = kFirstWidth;
  decoderNext_ = kFirstFreeCode;
  atStart_ = true;
}

StreamPacker::Slot& StreamPacker::FindSlot(uint32_t prefix, uint8_t byte) {
  const uint32_t key = prefix << 8 | byte;
  uint32_t index = key * 0x9E3779B1u >> (32 - kSlotBits);
  while (slots_[index].key != key && slots_[index].key != kFreeSlot) {
    index = (index + 1) % kSlotCount;
  }
  return slots_[index];
}

void StreamPacker::PutCode(uint32_t code) {
  pendingBits_ = pendingBits_ << width_ | code;
  pendingCount_ += width_;
  while (pendingCount_ >= 8) {
    pendingCount_ -= 8;
    stream_.push_back(static_cast<uint8_t>(pendingBits_ >> pendingCount_));
  }
  if (code == kWidenCode || code == kResetCode) return;
  if (!atStart_) ++decoderNext_;
  atStart_ = false;
}

// Widens or resets when the decoder's next free code has become the last that fits the width. Only
// called when more codes follow, so that no stream ends with one that says nothing.
void StreamPacker::FollowDecoder() {
  if (decoderNext_ != (1u << width_) - 1) return;
  if (width_ < kLastWidth) {
    PutCode(kWidenCode);
    ++width_;
  } else {
    PutCode(kResetCode);
    Reset();
  }
}

}  // namespace image

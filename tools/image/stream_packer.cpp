#include "tools/image/stream_packer.h"

#include <utility>

#include "tools/image/phrase_parser.h"
#include "tools/image/reset_planner.h"
#include "tools/image/stream_format.h"

namespace image {
namespace {

// Writes codes in the widths that the decoder expects.
class CodeWriter {
 public:
  void Put(uint32_t code) {
    // Only now that a code follows, so that no stream ends with one that says nothing.
    while (width_ < WidthBehind(count_)) {
      PutBits(kWidenCode);
      ++width_;
    }
    PutBits(code);
    ++count_;
    if (code != kResetCode) return;
    width_ = kFirstWidth;
    count_ = 0;
  }

  // The stream, its last byte filled with zero bits.
  std::vector<uint8_t> Finish() {
    if (pendingCount_ > 0)
      stream_.push_back(static_cast<uint8_t>(pendingBits_ << (8 - pendingCount_)));
    return std::move(stream_);
  }

 private:
  void PutBits(uint32_t code) {
    pendingBits_ = pendingBits_ << width_ | code;
    pendingCount_ += width_;
    while (pendingCount_ >= 8) {
      pendingCount_ -= 8;
      stream_.push_back(static_cast<uint8_t>(pendingBits_ >> pendingCount_));
    }
  }

  std::vector<uint8_t> stream_{std::begin(kStreamMagic), std::end(kStreamMagic)};
  uint32_t pendingBits_ = 0;  // the last pendingCount_ bits are not yet in stream_
  unsigned pendingCount_ = 0;
  unsigned width_ = kFirstWidth;
  uint32_t count_ = 0;  // codes since the last reset, those that widen not counted
};

// The stream of lives that end where told, and wherever else the table is full.
std::vector<uint8_t> WriteLives(std::span<const uint8_t> file, bool looksAhead,
                                const std::vector<size_t>& lifeEnds,
                                const std::function<void(size_t)>& progress) {
  CodeWriter codes;
  PhraseParser parser(file, looksAhead);
  size_t lifeStart = 0;
  const auto endLife = [&] {
    if (progress) progress(parser.Position() - lifeStart);
    lifeStart = parser.Position();
    if (lifeStart == file.size()) return;
    codes.Put(kResetCode);
    parser.Restart(lifeStart);
  };
  parser.Restart(lifeStart);
  for (const size_t end : lifeEnds) {
    while (parser.Position() < end) {
      codes.Put(parser.NextUpTo(end).code);
      if (parser.IsFull() && parser.Position() < end) endLife();
    }
    endLife();
  }
  return codes.Finish();
}

}  // namespace

std::vector<uint8_t> PackStream(std::span<const uint8_t> file, const PackMethod& method,
                                const std::function<void(size_t)>& progress) {
  if (file.empty()) return {'P', 'K', 'Z', 0};
  if (!method.plansResets) return WriteLives(file, method.looksAhead, {file.size()}, progress);
  return WriteLives(file, method.looksAhead, PlanResets(file, method.looksAhead, progress),
                    nullptr);
}

}  // namespace image

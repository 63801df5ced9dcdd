#include "tools/image/code_writer.h"

#include <utility>

namespace image {

void CodeWriter::ReturnTo(const Mark& mark) {
  stream_.resize(mark.bytes);
  pendingBits_ = mark.pendingBits;
  pendingCount_ = mark.pendingCount;
  width_ = mark.width;
}

std::vector<uint8_t> CodeWriter::Finish() {
  if (pendingCount_ > 0)
    stream_.push_back(static_cast<uint8_t>(pendingBits_ << (8 - pendingCount_)));
  return std::move(stream_);
}

}  // namespace image

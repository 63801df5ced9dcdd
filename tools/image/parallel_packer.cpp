#include "tools/image/parallel_packer.h"

#include <algorithm>

namespace image {

ParallelPacker::ParallelPacker(size_t count, const Job& job, unsigned threads) {
  for (size_t file = 0; file < count; ++file) {
    streams_.push_back(tasks_.emplace_back([job, file] { return job(file); }).get_future());
  }
  // The number of cores is 0 where it is not known.
  for (size_t left = std::min<size_t>(std::max(threads, 1u), count); left > 0; --left) {
    threads_.emplace_back([this] { Work(); });
  }
}

ParallelPacker::~ParallelPacker() {
  next_ = tasks_.size();
}

void ParallelPacker::Work() {
  for (size_t file = next_++; file < tasks_.size(); file = next_++) tasks_[file]();
}

}  // namespace image

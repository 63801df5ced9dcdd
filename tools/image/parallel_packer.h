// Packs many files at a time, one on each core, and gives their streams in whatever order they are
// asked for.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <future>
#include <thread>
#include <vector>

namespace image {

class ParallelPacker {
 public:
  using Stream = std::vector<uint8_t>;
  // Packs the file of this number. Called once for each, from several threads at a time.
  using Job = std::function<Stream(size_t)>;

  // Begins to pack the files 0 to `count` - 1, in this order.
  ParallelPacker(size_t count, const Job& job,
                 unsigned threads = std::thread::hardware_concurrency());
  // Files that are not begun are left out.
  ~ParallelPacker();
  ParallelPacker(const ParallelPacker&) = delete;
  ParallelPacker& operator=(const ParallelPacker&) = delete;

  // Waits for the stream of a file; to be asked for once. Throws what its job threw.
  Stream Take(size_t file) { return streams_[file].get(); }

 private:
  void Work();

  std::vector<std::packaged_task<Stream()>> tasks_;
  std::vector<std::future<Stream>> streams_;
  std::atomic<size_t> next_ = 0;       // the first file that nobody has begun
  std::vector<std::jthread> threads_;  // joined before the rest goes
};

}  // namespace image

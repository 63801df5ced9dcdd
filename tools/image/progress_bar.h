// A progress bar on standard error, shown only on a terminal and only for work of more than a
// second. It takes itself away at the end.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace image {

class ProgressBar {
 public:
  //   task   word in front of the bar
  //   total  bytes of the whole work
  ProgressBar(std::string task, uint64_t total);
  ~ProgressBar();
  ProgressBar(const ProgressBar&) = delete;
  ProgressBar& operator=(const ProgressBar&) = delete;

  // So many bytes more are done.
  void Advance(uint64_t bytes);

 private:
  using Clock = std::chrono::steady_clock;

  void Draw();

  std::string task_;
  uint64_t total_;
  uint64_t done_ = 0;
  bool onTerminal_;
  bool shown_ = false;
  Clock::time_point nextDraw_;
};

}  // namespace image

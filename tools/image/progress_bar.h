// A progress bar on standard error with rate and time left, shown only on a terminal and only for
// work of more than a second. It takes itself away at the end.
#pragma once

#include <chrono>
#include <cstdint>
#include <mutex>
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

  // So many bytes more are done. May be called from any thread.
  void Advance(uint64_t bytes);

 private:
  using Clock = std::chrono::steady_clock;

  void Draw(Clock::time_point now);
  void Show(const std::string& line);

  std::mutex mutex_;  // guards what changes
  std::string task_;
  uint64_t total_;
  uint64_t done_ = 0;
  bool onTerminal_;
  size_t shownWidth_ = 0;  // characters of the line on the terminal
  const Clock::time_point start_ = Clock::now();
  Clock::time_point nextDraw_ = start_ + std::chrono::seconds(1);
};

}  // namespace image

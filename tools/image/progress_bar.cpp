#include "tools/image/progress_bar.h"

#include <unistd.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <utility>

namespace image {
namespace {

using namespace std::chrono_literals;
constexpr uint64_t kBarWidth = 40;

}  // namespace

ProgressBar::ProgressBar(std::string task, uint64_t total)
    : task_(std::move(task)),
      total_(std::max<uint64_t>(total, 1)),
      onTerminal_(isatty(STDERR_FILENO) != 0) {}

ProgressBar::~ProgressBar() {
  if (shown_) std::fputs("\r\033[K", stderr);
}

void ProgressBar::Advance(uint64_t bytes) {
  if (!onTerminal_) return;
  const std::lock_guard lock(mutex_);
  done_ = std::min(done_ + bytes, total_);
  const Clock::time_point now = Clock::now();
  if (now < nextDraw_) return;
  nextDraw_ = now + 100ms;
  Draw(now);
}

void ProgressBar::Draw(Clock::time_point now) {
  shown_ = true;
  const auto filled = static_cast<size_t>(done_ * kBarWidth / total_);
  const std::string bar = std::string(filled, '#') + std::string(kBarWidth - filled, '.');
  const auto done = static_cast<double>(done_);
  const double seconds = std::chrono::duration<double>(now - start_).count();
  const double rate = std::max(done, 1.0) / seconds;
  const auto secondsLeft = std::lround(static_cast<double>(total_ - done_) / rate);
  std::fprintf(stderr, "\r%s [%s] %3d %%  %.1f MB/s  %ld:%02ld left\033[K", task_.c_str(),
               bar.c_str(), static_cast<int>(done_ * 100 / total_), rate / 1e6, secondsLeft / 60,
               secondsLeft % 60);
}

}  // namespace image

#include "tools/image/progress_bar.h"

#include <unistd.h>

#include <algorithm>
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
      onTerminal_(isatty(STDERR_FILENO) != 0),
      nextDraw_(Clock::now() + 1s) {}

ProgressBar::~ProgressBar() {
  if (shown_) std::fputs("\r\033[K", stderr);
}

void ProgressBar::Advance(uint64_t bytes) {
  done_ += bytes;
  if (!onTerminal_ || Clock::now() < nextDraw_) return;
  nextDraw_ = Clock::now() + 100ms;
  Draw();
}

void ProgressBar::Draw() {
  shown_ = true;
  const uint64_t done = std::min(done_, total_);
  const auto filled = static_cast<size_t>(done * kBarWidth / total_);
  const std::string bar = std::string(filled, '#') + std::string(kBarWidth - filled, '.');
  std::fprintf(stderr, "\r%s [%s] %3d %%", task_.c_str(), bar.c_str(),
               static_cast<int>(done * 100 / total_));
}

}  // namespace image

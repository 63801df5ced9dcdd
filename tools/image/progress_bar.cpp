#include "tools/image/progress_bar.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iostream>
#include <utility>

#include "tools/image/host_files.h"

namespace image {
namespace {

using namespace std::chrono_literals;
constexpr uint64_t kBarWidth = 30;

}  // namespace

ProgressBar::ProgressBar(std::string task, uint64_t total)
    : task_(std::move(task)), total_(std::max<uint64_t>(total, 1)), onTerminal_(HasTerminal()) {}

ProgressBar::~ProgressBar() {
  if (shownWidth_ > 0) Show("");
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
  const auto filled = static_cast<size_t>(done_ * kBarWidth / total_);
  const std::string bar = std::string(filled, '#') + std::string(kBarWidth - filled, '.');
  const auto done = static_cast<double>(done_);
  const double seconds = std::chrono::duration<double>(now - start_).count();
  const double rate = std::max(done, 1.0) / seconds;
  const auto secondsLeft = std::lround(static_cast<double>(total_ - done_) / rate);
  char line[100];
  std::snprintf(line, sizeof line, "%s [%s] %3d %%  %.1f MB/s  %ld:%02ld left", task_.c_str(),
                bar.c_str(), static_cast<int>(done_ * 100 / total_), rate / 1e6, secondsLeft / 60,
                secondsLeft % 60);
  Show(line);
}

// In place of the line that is shown, with blanks over what was longer: not every console knows the
// sequence that clears a line.
void ProgressBar::Show(const std::string& line) {
  const std::string blanks(shownWidth_ - std::min(shownWidth_, line.size()), ' ');
  std::cerr << '\r' + line + blanks + (line.empty() ? "\r" : "");  // in one go: it must not flicker
  shownWidth_ = line.size();
}

}  // namespace image

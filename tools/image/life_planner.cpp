// Dynamic programming. The phrases of a life depend on where it begins, not on where it ends, so
// that one parse from a candidate on tells the price of all lives that begin there; and the best
// way to a candidate is the cheapest of the lives that end there, each behind the best way to its
// own beginning.
//
// Most lives are hopeless soon: they lie behind a life that began earlier, and whose table still
// serves. A parse ends when it is so far behind that hardly one ever caught up.

#include "tools/image/life_planner.h"

#include <algorithm>
#include <limits>
#include <utility>

#include "tools/image/code_writer.h"
#include "tools/image/phrase_parser.h"

namespace image {
namespace {

// In bits. Where the life on the best way is an old one, its table will soon be full.
constexpr uint64_t HopelesslyBehind(uint32_t phrasesOnBestWay) {
  return 500 + phrasesOnBestWay / 4;
}

// The best way from the start of the file to a candidate, the reset there included.
struct Way {
  uint64_t bits = std::numeric_limits<uint64_t>::max();
  size_t lastStart = 0;  // the candidate at which its last life begins
  uint32_t phrases = 0;  // of that life, 0 for one of literals

  void TakeBetter(const Way& other) {
    if (other.bits < bits) *this = other;
  }
};

class Planner {
 public:
  Planner(std::span<const uint8_t> file, std::vector<size_t> places)
      : places_(std::move(places)), ways_(places_.size()), parser_(file, true) {
    ways_[0].bits = 0;
  }

  // Finds the ways over one more life. To be called for each place but the last, in order.
  void GoOnFrom(size_t start) {
    const size_t next = start + 1;
    const size_t literals = places_[next] - places_[start];
    ways_[next].TakeBetter(
        {ways_[start].bits + kFirstWidth * literals + ResetBits(next, kFirstWidth), start, 0});

    CodeWidth width;
    uint64_t bits = ways_[start].bits;
    parser_.Restart(places_[start]);
    for (size_t end = start + 1; end < places_.size() && !parser_.IsFull();) {
      bits += width.SizeWith(parser_.Next().code);
      for (; end < places_.size() && places_[end] <= parser_.Position(); ++end) {
        ways_[end].TakeBetter({bits + ResetBits(end, width.Bits()), start, parser_.Count()});
        if (bits > ways_[end].bits + HopelesslyBehind(ways_[end].phrases)) return;
      }
    }
  }

  std::vector<Life> BestWay() const {
    std::vector<Life> lives;
    for (size_t end = places_.size() - 1; end > 0; end = ways_[end].lastStart)
      lives.push_back({places_[end], ways_[end].phrases == 0});
    std::reverse(lives.begin(), lives.end());
    return lives;
  }

 private:
  uint32_t ResetBits(size_t end, unsigned width) const {
    return end + 1 < places_.size() ? width : 0;
  }

  std::vector<size_t> places_;  // the candidates and the file's size
  std::vector<Way> ways_;       // to each of them
  PhraseParser parser_;
};

}  // namespace

std::vector<Life> PlanLives(std::span<const uint8_t> file, std::vector<size_t> candidates,
                            const std::function<void(size_t)>& progress) {
  candidates.push_back(file.size());
  Planner planner(file, candidates);
  for (size_t start = 0; start + 1 < candidates.size(); ++start) {
    planner.GoOnFrom(start);
    if (progress) progress(candidates[start + 1] - candidates[start]);
  }
  return planner.BestWay();
}

}  // namespace image

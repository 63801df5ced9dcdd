// Dynamic programming. A life is what lies between two resets. Its phrases depend on where it
// begins, not on where it ends, so that one parse from a candidate on tells the price of all lives
// that begin there; and the best way to a candidate is the cheapest of the lives that end there,
// each behind the best way to its own beginning.

#include "tools/image/reset_planner.h"

#include <algorithm>
#include <array>
#include <limits>

#include "tools/image/phrase_parser.h"

namespace image {
namespace {

// Candidates are so many phrases apart. A life has about 21 times as many, so that planning takes
// about 21 times as long as packing, whatever the file.
constexpr uint32_t kPhrasesApart = 1536;

// bits[n] is the size of n codes behind a reset, those that widen included. A reset is one of them.
using CodeBits = std::array<uint32_t, kMostPhrases + 2>;

CodeBits CountBits() {
  CodeBits bits = {};
  unsigned width = kFirstWidth;
  for (uint32_t n = 1; n < bits.size(); ++n) {
    bits[n] = bits[n - 1];
    const unsigned needed = WidthBehind(n - 1);
    for (; width < needed; ++width) bits[n] += width;
    bits[n] += width;
  }
  return bits;
}

// From the start of the file to its end, both included.
std::vector<size_t> FindCandidates(std::span<const uint8_t> file, bool looksAhead) {
  std::vector<size_t> candidates;
  PhraseParser parser(file, looksAhead);
  parser.Restart(0);
  while (parser.Position() < file.size()) {
    if (parser.IsFull()) parser.Restart(parser.Position());
    if (parser.Count() % kPhrasesApart == 0) candidates.push_back(parser.Position());
    parser.Next();
  }
  candidates.push_back(file.size());
  return candidates;
}

}  // namespace

std::vector<size_t> PlanResets(std::span<const uint8_t> file, bool looksAhead,
                               const std::function<void(size_t)>& progress) {
  struct Way {
    uint64_t bits = std::numeric_limits<uint64_t>::max();
    size_t lastStart = 0;  // the candidate at which its last life begins
  };
  const CodeBits codeBits = CountBits();
  const std::vector<size_t> candidates = FindCandidates(file, looksAhead);
  const size_t last = candidates.size() - 1;
  std::vector<Way> best(candidates.size());
  best[0].bits = 0;
  PhraseParser parser(file, looksAhead);
  for (size_t start = 0; start < last; ++start) {
    parser.Restart(candidates[start]);
    for (size_t end = start + 1; end <= last && !parser.IsFull();) {
      parser.Next();
      for (; end <= last && candidates[end] <= parser.Position(); ++end) {
        const uint32_t reset = end < last ? 1 : 0;
        const uint64_t bits = best[start].bits + codeBits[parser.Count() + reset];
        if (bits < best[end].bits) best[end] = {bits, start};
      }
    }
    if (progress) progress(candidates[start + 1] - candidates[start]);
  }

  std::vector<size_t> ends;
  for (size_t end = last; end > 0; end = best[end].lastStart) ends.push_back(candidates[end]);
  std::reverse(ends.begin(), ends.end());
  return ends;
}

}  // namespace image

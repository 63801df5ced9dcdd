#include "tools/image/stream_packer.h"

#include <limits>
#include <utility>

#include "tools/image/code_writer.h"
#include "tools/image/life_planner.h"
#include "tools/image/phrase_parser.h"
#include "tools/image/stream_format.h"

namespace image {
namespace {

// A place between two phrases.
struct Place {
  size_t position;  // in the file
  CodeWriter::Mark mark;
  int64_t excess;  // bits by which the stream is longer than literals would be, one a byte
};

// Finds a stretch of a life whose codes take more room than literals would, by so much that these
// are worth a reset in front of them and one behind.
class BulgeFinder {
 public:
  explicit BulgeFinder(const Place& lifeStart) : low_(lifeStart), high_(lifeStart) {}

  // To be called for places in the order of the file. True when a stretch has ended.
  bool HasEndedAt(const Place& place) {
    if (place.excess >= high_.excess) high_ = place;
    const int64_t fallen = high_.excess - place.excess;
    if (fallen > 0 && high_.excess - low_.excess > kTableWorth) return true;
    if (place.excess < low_.excess) low_ = high_ = place;
    return false;
  }
  // The same for the place where the life ends, and with it the table's worth.
  bool HasEndedWithLifeAt(const Place& place) {
    if (HasEndedAt(place)) return true;
    high_ = place;
    return high_.excess - low_.excess > kFirstWidth;
  }

  const Place& Begin() const { return low_; }
  const Place& End() const { return high_; }

 private:
  // Bits. A reset inside a life costs what the table would have saved behind it.
  static constexpr int64_t kTableWorth = 16384;

  Place low_;   // of all places the one with the least excess
  Place high_;  // of those behind low_ the one with the most
};

class FilePacker {
 public:
  FilePacker(std::span<const uint8_t> file, const PackMethod& method)
      : file_(file), method_(method), parser_(file, method.looksAhead) {}

  // Each life ends when its table is full, or behind a stretch of literals.
  std::vector<uint8_t> PackUnplanned(const std::function<void(size_t)>& progress) {
    for (size_t start = 0; start < file_.size();) {
      const size_t end = WriteLife(start);
      if (progress) progress(end - start);
      if (end < file_.size()) codes_.Put(kResetCode);
      start = end;
    }
    return codes_.Finish();
  }

  std::vector<uint8_t> PackPlanned(const std::vector<Life>& lives) {
    size_t start = 0;
    for (const Life& life : lives) {
      if (start > 0) codes_.Put(kResetCode);
      if (life.areLiterals) {
        WriteLiterals(start, life.end);
      } else {
        for (const uint32_t code : CodesOf(start, life.end)) codes_.Put(code);
      }
      start = life.end;
    }
    return codes_.Finish();
  }

  // Where lives began and literals did, and places between them.
  const std::vector<size_t>& Candidates() const { return candidates_; }

 private:
  static constexpr uint32_t kPhrasesBetweenLooks = 256;
  // The lives that are planned take about 10 times as long as one that isn't.
  static constexpr uint32_t kPhrasesBetweenCandidates = 7 * kPhrasesBetweenLooks;

  Place Here() const {
    const auto literals = static_cast<int64_t>(kFirstWidth * parser_.Position());
    return {parser_.Position(), codes_.Here(), static_cast<int64_t>(codes_.Bits()) - literals};
  }

  // The codes of a life, by that worth of an entry which gives the fewest bits.
  std::vector<uint32_t> CodesOf(size_t start, size_t end) {
    std::vector<uint32_t> best;
    uint64_t fewestBits = std::numeric_limits<uint64_t>::max();
    for (const int worth : {PhraseParser::kUsualWorth, 24, 36}) {
      std::vector<uint32_t> codes;
      uint64_t bits = 0;
      CodeWidth width;
      parser_.Restart(start, worth);
      while (parser_.Position() < end && !parser_.IsFull()) {
        codes.push_back(parser_.NextUpTo(end).code);
        bits += width.SizeWith(codes.back());
      }
      if (parser_.Position() < end || bits >= fewestBits) continue;
      fewestBits = bits;
      best = std::move(codes);
    }
    return best;
  }

  // Where it ended.
  size_t WriteLife(size_t start) {
    parser_.Restart(start);
    candidates_.push_back(start);
    BulgeFinder bulge(Here());
    while (parser_.Position() < file_.size() && !parser_.IsFull()) {
      codes_.Put(parser_.Next().code);
      if (parser_.Count() % kPhrasesBetweenLooks != 0) continue;
      if (method_.usesLiterals && bulge.HasEndedAt(Here())) return ReplaceByLiterals(bulge, start);
      if (parser_.Count() % kPhrasesBetweenCandidates == 0)
        candidates_.push_back(parser_.Position());
    }
    if (method_.usesLiterals && bulge.HasEndedWithLifeAt(Here()))
      return ReplaceByLiterals(bulge, start);
    return parser_.Position();
  }

  size_t ReplaceByLiterals(const BulgeFinder& bulge, size_t lifeStart) {
    const size_t begin = bulge.Begin().position;
    const size_t end = bulge.End().position;
    codes_.ReturnTo(bulge.Begin().mark);
    while (candidates_.back() > begin) candidates_.pop_back();
    if (begin > lifeStart) {
      codes_.Put(kResetCode);
      candidates_.push_back(begin);
    }
    WriteLiterals(begin, end);
    return end;
  }

  void WriteLiterals(size_t begin, size_t end) {
    for (size_t position = begin; position < end; ++position) {
      if (position > begin && (position - begin) % kMostPhrases == 0) codes_.Put(kResetCode);
      codes_.Put(file_[position]);
    }
  }

  std::span<const uint8_t> file_;
  PackMethod method_;
  CodeWriter codes_;
  PhraseParser parser_;
  std::vector<size_t> candidates_;
};

}  // namespace

std::vector<uint8_t> PackStream(std::span<const uint8_t> file, const PackMethod& method,
                                const std::function<void(size_t)>& progress) {
  if (file.empty()) return {'P', 'K', 'Z', 0};
  if (!method.plansLives) return FilePacker(file, method).PackUnplanned(progress);
  FilePacker packer(file, method);
  std::vector<uint8_t> unplanned = packer.PackUnplanned(nullptr);
  std::vector<uint8_t> planned =
      FilePacker(file, method).PackPlanned(PlanLives(file, packer.Candidates(), progress));
  return planned.size() < unplanned.size() ? planned : unplanned;
}

}  // namespace image

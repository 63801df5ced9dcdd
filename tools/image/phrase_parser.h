// Divides a file into phrases, the strings that one code each stands for, and keeps the table that
// these codes make.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

#include "tools/image/code_table.h"

namespace image {

struct Phrase {
  uint32_t code = 0;
  size_t length = 0;
};

class PhraseParser {
 public:
  static constexpr int kUsualWorth = 30;

  // The file stays the caller's, and outlives the parser. Without looking ahead each phrase is the
  // longest that the table has; else it may be shorter, if the next one then reaches further.
  PhraseParser(std::span<const uint8_t> file, bool looksAhead)
      : file_(file), looksAhead_(looksAhead) {}

  // Empties the table and goes on at `position`. To be called before the first phrase.
  //   worth  of an entry, in tenths of a byte: what a shorter phrase has to gain in the beginning,
  //          where it is as long as the one behind it
  void Restart(size_t position, int worth = kUsualWorth);

  size_t Position() const { return position_; }
  // Phrases since the last Restart.
  uint32_t Count() const { return count_; }
  // Whether the table is to be emptied before another phrase is taken.
  bool IsFull() const { return count_ == kMostPhrases; }

  // Takes the next phrase; there is none at the end of the file or with a full table.
  Phrase Next();
  // The same, cut off at `end`, behind which the table has to be emptied.
  Phrase NextUpTo(size_t end);

 private:
  size_t LeastGain(size_t longest, size_t following) const;
  Phrase LongestAt(size_t position, size_t needed = 0) const;
  void Lengthen(Phrase* phrase, size_t position, size_t needed) const;
  void Shorten(Phrase* phrase, Phrase* following) const;
  uint32_t PrefixCode(const Phrase& phrase, size_t length) const;

  std::span<const uint8_t> file_;
  bool looksAhead_;
  CodeTable table_;
  size_t position_ = 0;
  uint32_t count_ = 0;
  int worth_ = kUsualWorth;
  Phrase longest_;  // the longest that the table has at position_
};

}  // namespace image

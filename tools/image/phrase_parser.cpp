// Each code that the decoder reads gives it one entry, the string of the code before with one byte
// more. The parser gives the entry to its table one phrase earlier: the next phrase may then be
// that very entry, which is the decoder's next free code, and which the decoder knows how to read.
//
// A phrase that is shorter than it could be gives the decoder an entry for a string that has one
// already: its code is spent, and nothing is won for the table. So it has to gain some bytes.

#include "tools/image/phrase_parser.h"

#include <algorithm>

namespace image {
namespace {

// Keeps the time for files of long runs in bounds; in others hardly more is ever won.
constexpr size_t kMostShortened = 32;

}  // namespace

void PhraseParser::Restart(size_t position, int worth) {
  worth_ = worth;
  table_.Clear();
  position_ = position;
  count_ = 0;
  longest_ = LongestAt(position);
}

Phrase PhraseParser::Next() {
  Phrase phrase = longest_;
  Phrase following = LongestAt(position_ + phrase.length);
  if (looksAhead_) Shorten(&phrase, &following);

  const size_t end = position_ + phrase.length;
  if (phrase.length == longest_.length && end < file_.size()) {
    table_.Add(phrase.code, file_[end], kFirstFreeCode + count_);
    // The new entry can lengthen the phrase behind it, but only from the string it was made of.
    if (following.code == phrase.code) Lengthen(&following, end, 0);
  }
  position_ = end;
  longest_ = following;
  ++count_;
  return phrase;
}

Phrase PhraseParser::NextUpTo(size_t end) {
  const size_t room = end - position_;
  Phrase phrase = Next();
  if (phrase.length > room) {
    phrase = {PrefixCode(phrase, room), room};
    position_ = end;
  }
  return phrase;
}

// How many bytes further phrase and following have to reach for a shorter phrase. The entry that it
// costs is worth the more the longer the phrase is against the one behind it, and the less the
// later it is made. Numbers found by trial, on libraries and on texts.
size_t PhraseParser::LeastGain(size_t longest, size_t following) const {
  const int64_t tenths = worth_ + 4 * static_cast<int64_t>(longest) -
                         5 * static_cast<int64_t>(following) - count_ / 1300;
  return static_cast<size_t>(std::max<int64_t>(tenths / 10, 1));
}

// The longest string of the table at `position`. Where none has `needed` bytes, it may be a shorter
// one.
Phrase PhraseParser::LongestAt(size_t position, size_t needed) const {
  if (position == file_.size()) return {};
  Phrase phrase = {file_[position], 1};
  Lengthen(&phrase, position, needed);
  return phrase;
}

void PhraseParser::Lengthen(Phrase* phrase, size_t position, size_t needed) const {
  while (position + phrase->length < file_.size() && table_.Reach(phrase->code) >= needed) {
    const uint32_t code = table_.Find(phrase->code, file_[position + phrase->length]);
    if (code == CodeTable::kNoCode) break;
    *phrase = {code, phrase->length + 1};
  }
}

// Takes the length with which phrase and following reach furthest, if that is worth it.
void PhraseParser::Shorten(Phrase* phrase, Phrase* following) const {
  const size_t longest = phrase->length;
  size_t needed = longest + following->length + LeastGain(longest, following->length);
  for (size_t length = longest - 1; length > 0 && longest - length <= kMostShortened; --length) {
    const Phrase candidate = LongestAt(position_ + length, needed - length);
    if (length + candidate.length < needed) continue;
    needed = length + candidate.length + 1;
    *phrase = {PrefixCode(*phrase, length), length};
    *following = candidate;
  }
}

uint32_t PhraseParser::PrefixCode(const Phrase& phrase, size_t length) const {
  uint32_t code = phrase.code;
  for (size_t left = phrase.length; left > length; --left) code = table_.PrefixOf(code);
  return code;
}

}  // namespace image

// The decoders that are timed against each other, each with streams of its own format for the same
// files.
#pragma once

#include <cstdint>
#include <cstring>
#include <span>
#include <vector>

using Bytes = std::span<const uint8_t>;

// Counts the output of a decoder; compares it too when there is something to compare it with.
class Output {
 public:
  Output() = default;
  explicit Output(Bytes expected) : expected_(expected) {}

  void Take(const void* bytes, size_t count) {
    if (!expected_.empty()) Compare(bytes, count);
    count_ += count;
  }
  uint64_t count() const { return count_; }
  bool differs() const { return differs_ || (!expected_.empty() && count_ != expected_.size()); }

 private:
  void Compare(const void* bytes, size_t count) {
    const bool fits = count <= expected_.size() - count_;
    if (!fits || memcmp(expected_.data() + count_, bytes, count) != 0) differs_ = true;
    if (!fits) expected_ = {};
  }

  Bytes expected_;
  uint64_t count_ = 0;
  bool differs_ = false;
};

struct Decoder {
  const char* name;
  const char* extension;  // of its streams, added to the name of the file
  // Hands over the whole output of a stream; false when the stream was refused.
  bool (*decode)(Bytes stream, Output* output);
};

// The program's expander, in blocks of 1024 bytes as an install reads them.
bool DecodeByExpander(Bytes stream, Output* output);
// A plain decoder, step by step as the format is described.
bool DecodePlainly(Bytes stream, Output* output);

// Bytes of the heap that one expander takes for itself and its tables; 0 where the C library can't
// tell.
uint64_t ExpanderMemory();

// Decoders of other makers; none in the Windows builds.
std::vector<Decoder> PeerDecoders();

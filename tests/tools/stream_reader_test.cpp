// What the reader of streams expands and what it refuses.

#include "tools/image/stream_reader.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "tests/support/code_stream.h"

namespace {

struct Expansion {
  std::string bytes;
  bool failed;
};

Expansion Expand(const std::string& stream, size_t blockSize = 65536) {
  size_t used = 0;
  image::StreamReader reader([&](std::span<uint8_t> to) {
    const size_t count = std::min({to.size(), blockSize, stream.size() - used});
    std::copy_n(stream.begin() + static_cast<ptrdiff_t>(used), count, to.begin());
    used += count;
    return count;
  });
  Expansion expansion;
  for (auto piece = reader.Next(); !piece.empty(); piece = reader.Next())
    expansion.bytes.append(piece.begin(), piece.end());
  expansion.failed = !reader.Fault().empty();
  return expansion;
}

void ExpectExpands(const CodeStream& codes, const std::string& bytes) {
  for (const size_t blockSize : {1u, 2u, 3u, 4u, 7u, 1024u}) {
    const Expansion expansion = Expand(codes.Stream(), blockSize);
    EXPECT_EQ(expansion.bytes, bytes) << blockSize;
    EXPECT_FALSE(expansion.failed) << blockSize;
  }
}

}  // namespace

TEST(StreamReader, ExpandsWhateverTheBlocks) {
  ExpectExpands(CodeStream().Put('a').Put('b').Put(259).Put(261), "abababa");
  ExpectExpands(CodeStream().Put('a').Put(257).Put('b').Put(258).Put('c').Put(259), "abccc");
}

TEST(StreamReader, RefusesWhatNoExpanderTakes) {
  const struct {
    const char* why;
    std::string stream;
  } rows[] = {
      {"nothing", ""},
      {"the magic alone", "PKZ"},
      {"a wrong magic", "PKz??"},
      {"a first code of 256", CodeStream().Put(256).Stream()},
      {"a first code that widens", CodeStream().Put(257).Stream()},
      {"a first code that resets", CodeStream().Put(258).Stream()},
      {"code 256", CodeStream().Put(97).Put(256).Stream()},
      {"a code above the next free one", CodeStream().Put(97).Put(260).Stream()},
      {"a widening after a reset", CodeStream().Put(97).Put(258).Put(257).Stream()},
      {"an entry from before a reset",
       CodeStream().Put(97).Put(98).Put(258).Put(99).Put(260).Stream()},
      {"a code of 32 bits with its top bit set",
       CodeStream().Put(97).PutTimes(257, 23).Put(0xFFFFFFFF).Stream()},
  };
  for (const auto& row : rows) EXPECT_TRUE(Expand(row.stream).failed) << row.why;
}

TEST(StreamReader, TakesCodesOf32BitsAndNoWiderOnes) {
  CodeStream codes;
  codes.Put('a').PutTimes(257, 23).Put(259);
  ExpectExpands(codes, "aaa");
  EXPECT_TRUE(Expand(codes.Put(257).Stream()).failed);
}

TEST(StreamReader, TakesAsManyCodesAsTheTableHolds) {
  CodeStream codes;
  codes.Put('a').PutTimes(257, 7).PutTimes('a', 35023 - 259);
  const std::string all(35023 - 259 + 1, 'a');
  ExpectExpands(codes, all);
  const Expansion overfull = Expand(codes.Put('a').Stream());
  EXPECT_EQ(overfull.bytes, all);
  EXPECT_TRUE(overfull.failed);
}

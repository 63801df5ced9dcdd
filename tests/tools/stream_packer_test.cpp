// Streams that the packer makes and the reader expands, and what the reader refuses.

#include "tools/image/stream_packer.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "tests/tools/tool_bench.h"
#include "tools/image/stream_reader.h"

namespace {

using Bytes = std::vector<uint8_t>;

image::StreamReader ReaderOf(const Bytes& stream, size_t blockSize) {
  return image::StreamReader([&stream, blockSize, used = size_t{0}](std::span<uint8_t> to) mutable {
    const size_t count = std::min({to.size(), blockSize, stream.size() - used});
    std::copy_n(stream.begin() + static_cast<ptrdiff_t>(used), count, to.begin());
    used += count;
    return count;
  });
}

Bytes Expand(const Bytes& stream, std::string* fault, size_t blockSize = 65536) {
  image::StreamReader reader = ReaderOf(stream, blockSize);
  Bytes output;
  for (auto piece = reader.Next(); !piece.empty(); piece = reader.Next()) {
    output.insert(output.end(), piece.begin(), piece.end());
  }
  *fault = reader.Fault();
  return output;
}

void ExpectRoundTrip(const Bytes& file) {
  const Bytes stream = image::StreamPacker().Pack(file);
  std::string fault;
  const Bytes expanded = Expand(stream, &fault);
  EXPECT_EQ(fault, "");
  EXPECT_TRUE(expanded == file) << file.size() << " bytes came out as " << expanded.size();
}

Bytes BytesOfText(const std::string& text) {
  return {text.begin(), text.end()};
}

// Codes of a stream, written with the widths given.
class CodeWriter {
 public:
  CodeWriter& Put(uint32_t code, unsigned width = 9) {
    for (unsigned bit = width; bit-- > 0;) {
      if (count_++ % 8 == 0) stream_.push_back(0);
      stream_.back() =
          static_cast<uint8_t>(stream_.back() | (code >> bit & 1) << (8 - (count_ - 1) % 8 - 1));
    }
    return *this;
  }
  const Bytes& Stream() const { return stream_; }

 private:
  Bytes stream_ = {'P', 'K', 'Z'};
  size_t count_ = 0;
};

// The codes of a stream by the rules of the format alone, each with the next free code before it.
struct CodeAt {
  uint32_t code;
  uint32_t nextFree;
  unsigned width;
};

std::vector<CodeAt> SplitCodes(const Bytes& stream) {
  std::vector<CodeAt> codes;
  size_t bit = 24;
  unsigned width = 9;
  uint32_t next = 259;
  bool atStart = true;
  while (stream.size() * 8 - bit >= width) {
    uint32_t code = 0;
    for (unsigned i = 0; i < width; ++i, ++bit) {
      code = code << 1 | (stream[bit / 8] >> (7 - bit % 8) & 1);
    }
    codes.push_back({code, next, width});
    if (code == 257) {
      ++width;
    } else if (code == 258) {
      width = 9;
      next = 259;
      atStart = true;
    } else {
      if (!atStart) ++next;
      atStart = false;
    }
  }
  return codes;
}

}  // namespace

TEST(StreamPacker, PacksTheWorkedExample) {
  EXPECT_EQ(image::StreamPacker().Pack(BytesOfText("abababa")),
            (Bytes{0x50, 0x4B, 0x5A, 0x30, 0x98, 0xA0, 0x70, 0x50}));
}

TEST(StreamPacker, GivesAnEmptyFileTheShortestStream) {
  const Bytes stream = image::StreamPacker().Pack({});
  EXPECT_EQ(stream, (Bytes{'P', 'K', 'Z', 0}));
  std::string fault;
  EXPECT_TRUE(Expand(stream, &fault).empty());
  EXPECT_EQ(fault, "");
}

TEST(StreamPacker, RoundTrips) {
  ExpectRoundTrip({0});
  ExpectRoundTrip({255});
  ExpectRoundTrip(Bytes(1'000'000, 0));
  ExpectRoundTrip(RandomBytes(1'000'000, 1));
  Bytes text;
  for (int i = 0; text.size() < 600'000; ++i) {
    const Bytes line = BytesOfText("line " + std::to_string(i * 7919) + " of a text\r\n");
    text.insert(text.end(), line.begin(), line.end());
  }
  ExpectRoundTrip(text);
  Bytes mixed = text;
  const Bytes noise = RandomBytes(200'000, 2);
  mixed.insert(mixed.begin() + 100'000, noise.begin(), noise.end());
  mixed.insert(mixed.end(), 100'000, 0);
  ExpectRoundTrip(mixed);
}

// Random bytes give about one entry a byte: the lengths around each widening and the first reset.
TEST(StreamPacker, RoundTripsWithAnEndNearEachWideningAndReset) {
  const Bytes noise = RandomBytes(40'000, 3);
  image::StreamPacker packer;
  for (const size_t limit : {511u, 1023u, 2047u, 4095u, 8191u, 16383u, 32767u}) {
    // The length at which the decoder's next free code gets there.
    size_t length = limit - 259;
    while (true) {
      const auto codes = SplitCodes(packer.Pack(std::span(noise).first(length)));
      if (codes.back().nextFree >= limit - 2) break;
      length += std::max<size_t>(1, (limit - 2 - codes.back().nextFree) / 2);
    }
    for (size_t end = length; end < length + 8; ++end) {
      ExpectRoundTrip(Bytes(noise.begin(), noise.begin() + static_cast<ptrdiff_t>(end)));
    }
  }
}

TEST(StreamPacker, WidensAndResetsAtTheFixedPlacesAlone) {
  const auto codes = SplitCodes(image::StreamPacker().Pack(RandomBytes(200'000, 4)));
  size_t resets = 0;
  for (const CodeAt& at : codes) {
    const bool isLastThatFits = at.nextFree == (1u << at.width) - 1;
    ASSERT_EQ(isLastThatFits, at.code == (at.width < 15 ? 257u : 258u)) << at.nextFree;
    ASSERT_NE(at.code, 256u);
    if (at.code == 258) ++resets;
  }
  EXPECT_GT(resets, 3u);
}

TEST(StreamPacker, TellsOfEveryByteTaken) {
  for (const size_t size : {1u, 65536u, 65537u, 200'000u}) {
    size_t taken = 0;
    image::StreamPacker().Pack(Bytes(size, 'x'), [&taken](size_t count) { taken += count; });
    EXPECT_EQ(taken, size);
  }
}

TEST(StreamReader, GivesTheSameForEveryBlockSize) {
  const Bytes file = RandomBytes(5000, 5);
  const Bytes stream = image::StreamPacker().Pack(file);
  for (const size_t blockSize : {1u, 2u, 3u, 4u, 7u, 1024u}) {
    std::string fault;
    EXPECT_TRUE(Expand(stream, &fault, blockSize) == file) << blockSize;
    EXPECT_EQ(fault, "") << blockSize;
  }
}

TEST(StreamReader, TakesACodeThatIsTheNextFreeOne) {
  std::string fault;
  EXPECT_EQ(Expand(CodeWriter().Put(97).Put(259).Stream(), &fault), BytesOfText("aaa"));
  EXPECT_EQ(fault, "");
}

TEST(StreamReader, GoesOnWithALiteralOfNineBitsAfterAReset) {
  const Bytes stream =
      CodeWriter().Put('a').Put(257).Put('b', 10).Put(258, 10).Put('c').Put(259).Stream();
  std::string fault;
  EXPECT_EQ(Expand(stream, &fault), BytesOfText("abccc"));
  EXPECT_EQ(fault, "");
}

TEST(StreamReader, RefusesWhatNoExpanderTakes) {
  const struct {
    const char* why;
    Bytes stream;
  } rows[] = {
      {"nothing", {}},
      {"half the magic", {'P', 'K'}},
      {"the magic alone", {'P', 'K', 'Z'}},
      {"a wrong magic", {'P', 'K', 'z', 0, 0}},
      {"a first code of 256", CodeWriter().Put(256).Stream()},
      {"a first code that widens", CodeWriter().Put(257).Stream()},
      {"a first code that resets", CodeWriter().Put(258).Stream()},
      {"a first code that has no entry", CodeWriter().Put(259).Stream()},
      {"code 256", CodeWriter().Put(97).Put(256).Stream()},
      {"a code above the next free one", CodeWriter().Put(97).Put(260).Stream()},
      {"a widening after a reset", CodeWriter().Put(97).Put(258).Put(257).Stream()},
      {"an entry from before a reset",
       CodeWriter().Put(97).Put(98).Put(258).Put(99).Put(260).Stream()},
  };
  for (const auto& row : rows) {
    std::string fault;
    Expand(row.stream, &fault);
    EXPECT_NE(fault, "") << row.why;
  }
}

TEST(StreamReader, RefusesTheCodeThatMakesTheWidth33) {
  CodeWriter codes;
  codes.Put(97);
  for (unsigned width = 9; width < 32; ++width) codes.Put(257, width);
  codes.Put(259, 32);
  std::string fault;
  EXPECT_EQ(Expand(codes.Stream(), &fault), BytesOfText("aaa"));
  EXPECT_EQ(fault, "");
  codes.Put(257, 32);
  Expand(codes.Stream(), &fault);
  EXPECT_NE(fault, "");
}

TEST(StreamReader, RefusesACodeOf32BitsWithItsTopBitSet) {
  CodeWriter codes;
  codes.Put(97);
  for (unsigned width = 9; width < 32; ++width) codes.Put(257, width);
  codes.Put(0xFFFFFFFF, 32);
  std::string fault;
  EXPECT_EQ(Expand(codes.Stream(), &fault), BytesOfText("a"));
  EXPECT_NE(fault, "");
}

TEST(StreamReader, TakesAsManyCodesAsTheTableHolds) {
  CodeWriter codes;
  codes.Put(97);
  unsigned width = 9;
  for (; width < 16; ++width) codes.Put(257, width);
  for (int entry = 259; entry < 35023; ++entry) codes.Put(97, width);
  std::string fault;
  EXPECT_EQ(Expand(codes.Stream(), &fault).size(), 35023u - 259 + 1);
  EXPECT_EQ(fault, "");
  codes.Put(97, width);
  EXPECT_EQ(Expand(codes.Stream(), &fault).size(), 35023u - 259 + 1);
  EXPECT_NE(fault, "");
}

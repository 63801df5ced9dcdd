// The decoder of the streams, and the collecting of its output. The reader of the tools has to take
// and to refuse the same streams.
#include "package/expander.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "package/data_file.h"
#include "tests/support/code_stream.h"
#include "tests/support/plain_expander.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"
#include "tools/image/stream_reader.h"

namespace {

const uint8_t* BytesOf(const std::string& text) {
  return reinterpret_cast<const uint8_t*>(text.data());
}

class CollectingExpander : public PkzExpander {
 public:
  void Expand(const std::string& codes) {
    PkzExpander::Expand(BytesOf(codes), static_cast<uint32_t>(codes.size()));
  }

  std::string output;

 protected:
  void WriteOutput(const uint8_t* bytes, uint32_t count) override {
    output.append(reinterpret_cast<const char*>(bytes), count);
  }
};

// What the reader of the tools makes of a stream, which comes to it in small blocks; "!" behind it
// when it is refused.
std::string Read(const std::string& stream) {
  size_t used = 0;
  image::StreamReader reader([&](std::span<uint8_t> to) {
    const size_t count = std::min({to.size(), 1 + used % 5, stream.size() - used});
    std::copy_n(stream.data() + used, count, to.begin());
    used += count;
    return count;
  });
  std::string output;
  for (auto piece = reader.Next(); !piece.empty(); piece = reader.Next())
    output.append(piece.begin(), piece.end());
  return output + (reader.Fault().empty() ? "" : "!");
}

// The output, and "!" behind it when the sequence was found bad.
std::string Expand(const std::string& codes) {
  CollectingExpander expander;
  expander.Expand(codes);
  const std::string result = expander.output + (expander.failed() != 0 ? "!" : "");
  EXPECT_EQ(Read(kStreamMagic + codes), result);
  return result;
}

std::string ExpandCodes(const std::vector<uint32_t>& codes) {
  CodeStream stream;
  for (const uint32_t code : codes) stream.Put(code);
  return Expand(stream.Codes());
}

// Literals from here are codes 97, 98, ...; the expected texts are worked out by hand.
TEST(Expander, FollowsTheFormat) {
  EXPECT_EQ(Expand("\x30\x98\xA0\x70\x50"), "abababa");
  // A code equal to the next free one repeats the string before and its first byte.
  EXPECT_EQ(ExpandCodes({97, 259, 261}), "aaa!");
  EXPECT_EQ(ExpandCodes({97, 98, 259, 261}), "abababa");
  EXPECT_EQ(ExpandCodes({97, 260}), "a!");
  // Only a literal stands at the start and behind a reset.
  for (const uint32_t code : {256u, 257u, 258u, 259u, 511u}) {
    EXPECT_EQ(ExpandCodes({code, 97}), "!") << code;
    EXPECT_EQ(ExpandCodes({97, 258, code, 97}), "a!") << code;
  }
  // A reset forgets the table and the width. It is read at the width in force.
  EXPECT_EQ(ExpandCodes({97, 98, 259, 258, 99, 259}), "ababccc");
  EXPECT_EQ(ExpandCodes({97, 98, 259, 258, 99, 260}), "ababc!");
  EXPECT_EQ(ExpandCodes({97, 257, 257, 98, 258, 99, 100}), "abcd");
  // Code 256 has no meaning. Bits that make no code are dropped.
  EXPECT_EQ(ExpandCodes({97, 98, 99, 256}), "abc!");
  EXPECT_EQ(Expand("\x30\xFF"), "a");
}

TEST(Expander, WidthsEndAt32) {
  CodeStream widest;
  widest.Put('a').PutTimes(257, 32 - 9);
  ASSERT_EQ(widest.width(), 32u);
  EXPECT_EQ(Expand(CodeStream(widest).Put('b').Put(259).Codes()), "abab");
  EXPECT_EQ(Expand(CodeStream(widest).Put(0x80000061).Codes()), "a!");
  EXPECT_EQ(Expand(CodeStream(widest).Put(257).Codes()), "a!");
}

TEST(Expander, TheTableTakesEntriesUpTo35022) {
  CodeStream codes;
  codes.PutTimes('a', 1 + 35023 - 259);
  const std::string output = Expand(codes.Codes());
  EXPECT_EQ(output, std::string(34765, 'a'));
  // The string of the step that finds the table full isn't given out.
  EXPECT_EQ(Expand(CodeStream(codes).Put('b').Codes()), output + "!");
  // The full table can still be left.
  EXPECT_EQ(Expand(CodeStream(codes).Put(257).Put(258).Put('b').Codes()), output + "b");
}

TEST(Expander, BuildsTheLongestString) {
  class MeasuringExpander : public CollectingExpander {
   public:
    uint64_t total = 0;
    uint32_t longest = 0;

   protected:
    void WriteOutput(const uint8_t*, uint32_t count) override {
      total += count;
      longest = std::max(longest, count);
    }
  };
  CodeStream codes;
  codes.Put('a');
  for (uint32_t code = 259; code < 35023; ++code) {  // each string is one byte longer
    while (code >> codes.width() != 0) codes.Put(257);
    codes.Put(code);
  }
  const auto expander = std::make_unique<MeasuringExpander>();
  expander->Expand(codes.Put(35023).Codes());
  EXPECT_EQ(expander->failed(), 1);
  EXPECT_EQ(expander->longest, 34765u);
  EXPECT_EQ(expander->total, 34765ull * 34766 / 2);
}

// Streams to compare the program's decoder with the plain one over.

using Random = std::mt19937;

size_t Below(Random& random, size_t limit) {
  return random() % limit;
}

std::string RandomText(Random& random, size_t length, unsigned letters) {
  std::string text;
  while (length-- > 0) text += static_cast<char>(Below(random, letters));
  return text;
}

std::string PackedStream(Random& random) {
  const unsigned letters = 1u << Below(random, 9);
  return PackStream(RandomText(random, Below(random, 20000), letters));
}

std::string DamagedStream(Random& random) {
  std::string stream = PackedStream(random);
  for (size_t flips = 1 + Below(random, 3); flips > 0; --flips) {
    char& byte = stream[Below(random, stream.size())];
    byte = static_cast<char>(byte ^ (1 << Below(random, 8)));
  }
  return stream;
}

// Codes that mostly have a meaning where they stand, many of them the next free one, with widths up
// to 32 and resets in odd places.
std::string PlausibleStream(Random& random) {
  CodeStream codes;
  size_t free = 258;  // the next free code, once the first code has been put
  const size_t widening = 1 + Below(random, 8);
  for (size_t count = Below(random, 3000); count > 0 && codes.width() <= 32; --count) {
    const size_t limit = std::min<size_t>(free + 1, size_t{1} << codes.width());
    const size_t kind = Below(random, 200);
    const bool isFirst = free == 258;
    const size_t code = isFirst                     ? Below(random, 256)
                        : kind < widening           ? 257
                        : kind == 199               ? 258
                        : kind == 198               ? 250 + Below(random, 10)
                        : kind < 60 || limit <= 259 ? Below(random, 256)
                        : kind < 90                 ? limit - 1
                                                    : 259 + Below(random, limit - 259);
    codes.Put(static_cast<uint32_t>(code));
    free = code == 258 ? 258 : free + (code != 257 ? 1 : 0);
  }
  return codes.Stream();
}

// The longest strings: each code is the next free one, up to the table's last entry or beyond it.
std::string FullTableStream(Random& random) {
  CodeStream codes;
  codes.Put('a');
  const uint32_t end = 35021 + static_cast<uint32_t>(Below(random, 4));
  constexpr uint32_t kGrowth = 1200;  // the strings grow up to here
  for (uint32_t code = 259; code < end; ++code) {
    while (code >> codes.width() != 0) codes.Put(257);
    codes.Put(code < kGrowth ? code : 'a' + code % 5);
  }
  for (const uint32_t code : {kGrowth - 1, 34000u}) codes.Put(code);
  return codes.Put(258).Put('b').Put(259).Stream();
}

class FileExpander : public ProductTest {
 protected:
  FileExpander() { EXPECT_EQ(file_.Create(), 1); }

  void TearDown() override {
    EXPECT_EQ(file_.Close(), 1);
    ProductTest::TearDown();
  }

  template <typename Expander>
  void Take(Expander& expander, const std::string& block) {
    expander.ExpandBlock(BytesOf(block), static_cast<uint32_t>(block.size()));
  }

  DataFile file_{"C:\\out.bin"};
};

TEST_F(FileExpander, AgreesWithAPlainDecoderWhateverTheStreamItsSplittingAndAFailedWrite) {
  std::string (*const makers[])(Random&) = {PackedStream, DamagedStream, PlausibleStream};
  Random random(20011231);
  int failures = 0;
  for (int round = 0; round < 240; ++round) {
    SCOPED_TRACE(round);
    const bool isFull = round % 20 == 19;
    const std::string stream = isFull ? FullTableStream(random) : makers[round % 3](random);
    const size_t largest = round % 2 == 0 ? 1024 : 1 + Below(random, 40);
    const bool isFailing = Below(random, isFull ? 2 : 5) == 0;
    const int failingWrite = isFailing ? static_cast<int>(1 + Below(random, isFull ? 450 : 4)) : 0;
    if (failingWrite > 0) FailCall("WriteFile", failingWrite);
    if (failingWrite == 0) FailNothing();

    const auto expected = std::make_unique<RecordingPlainExpander>(failingWrite);
    const auto expander = std::make_unique<PkzFileExpander>(&file_);
    file_.Close();
    ASSERT_EQ(file_.Create(), 1);
    for (size_t used = 0; used < stream.size();) {
      const size_t least = used == 0 ? 4 : 0;
      const std::string block = stream.substr(used, least + Below(random, largest + 1));
      Take(*expected, block);
      Take(*expander, block);
      used += block.size();
      // A write has at most 1024 bytes: when both match, so do the sizes of the writes.
      ASSERT_EQ(machine::CallCount("WriteFile"), expected->writes);
      ASSERT_EQ(file_.Tell(), static_cast<int32_t>(expected->output.size()));
      ASSERT_EQ(expander->failed(), expected->failed());
    }
    failures += expected->failed();
    if (expected->failed() == 0) {
      ASSERT_EQ(expander->bufferFill(), expected->bufferFill());
      expander->Flush();
      expected->Flush();
      ASSERT_EQ(expander->failed(), expected->failed());
    }
    ASSERT_TRUE(pc.Read("drive_c/out.bin") == expected->output);
    if (failingWrite > 0) continue;
    expected->Flush();
    ASSERT_TRUE(Read(stream) == expected->output + (expected->failed() != 0 ? "!" : ""));
  }
  // Both verdicts were met often.
  EXPECT_GT(failures, 60);
  EXPECT_LT(failures, 180);
}

TEST_F(FileExpander, TheFirstBlockHoldsTheMagicAndOneByteMore) {
  const std::string stream = CodeStream().Put('a').Put('b').Stream();
  for (const size_t first : {0u, 3u, 4u, 6u}) {
    PkzFileExpander expander(nullptr);
    Take(expander, stream.substr(0, first));
    Take(expander, stream.substr(first));
    EXPECT_EQ(expander.failed(), first < 4 ? 1 : 0) << first;
    EXPECT_EQ(expander.bufferFill(), first < 4 ? 0u : 2u) << first;
  }
  for (const std::string bad : {"", "PKZ", "PKz??", "PKK0"}) EXPECT_EQ(Read(bad), "!") << bad;
}

}  // namespace

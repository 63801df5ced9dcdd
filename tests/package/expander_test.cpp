// The decoder of the streams, and the collecting of its output, held against the reader of the
// tools, block by block. tests/fuzz/corpus/expander has many more streams: of the widest codes, and
// around a full table.
#include "package/expander.h"

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "tests/support/code_stream.h"
#include "tests/support/expander_check.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

class Expander : public ProductTest {
 protected:
  // The output, and "!" behind it when the sequence was found bad: by the block and by the byte.
  std::string Expand(const std::string& codes) const {
    const std::string output = ExpandChecked(pc, SplitStream(codes, {codes.size()}));
    EXPECT_TRUE(ExpandChecked(pc, SplitStream(codes, {1})) == output);
    return output;
  }

  std::string ExpandCodes(const std::vector<uint32_t>& codes) const {
    CodeStream stream;
    for (const uint32_t code : codes) stream.Put(code);
    return Expand(stream.Codes());
  }
};

// Literals from here are codes 97, 98, ...; the expected texts are worked out by hand.
TEST_F(Expander, FollowsTheFormat) {
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

TEST_F(Expander, BuildsTheLongestString) {
  class MeasuringExpander : public PkzExpander {
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
  const std::string stream = codes.Put(35023).Codes();
  const auto expander = std::make_unique<MeasuringExpander>();
  expander->Expand(reinterpret_cast<const uint8_t*>(stream.data()),
                   static_cast<uint32_t>(stream.size()));
  EXPECT_EQ(expander->failed(), 1);
  EXPECT_EQ(expander->longest, 34765u);
  EXPECT_EQ(expander->total, 34765ull * 34766 / 2);
}

TEST_F(Expander, GivesTheSameInBlocksOfAnySizeAndStopsAtAFailedWrite) {
  // The last one's strings grow beyond what is written at a time.
  for (const std::string& file : {std::string(1024, 'x'), std::string(1025, 'x'),
                                  RandomBytes(50'000, 1), std::string(1'000'000, 'x')}) {
    const std::string codes = PackStream(file).substr(kStreamMagicSize);
    EXPECT_TRUE(Expand(codes) == file);
    for (const std::vector<size_t>& sizes : {std::vector<size_t>{1024}, {7, 0, 3, 31}, {65536}}) {
      for (const size_t failing :
           {size_t{0}, size_t{1}, size_t{2}, file.size() / 2048, file.size() / 1024 - 1})
        (void)ExpandChecked(pc, SplitStream(codes, sizes), failing);
    }
  }
}

TEST_F(Expander, TheFirstBlockHoldsTheMagicAndOneByteMore) {
  const std::string stream = CodeStream().Put('a').Put('b').Stream();
  for (const size_t first : {0u, 3u, 4u, 6u}) {
    PkzFileExpander expander(nullptr);
    for (const std::string& block : {stream.substr(0, first), stream.substr(first)}) {
      expander.ExpandBlock(reinterpret_cast<const uint8_t*>(block.data()),
                           static_cast<uint32_t>(block.size()));
    }
    EXPECT_EQ(expander.failed(), first < 4 ? 1 : 0) << first;
    EXPECT_EQ(expander.bufferFill(), first < 4 ? 0u : 2u) << first;
  }
  for (const std::string bad : {"", "PKZ", "PKz??", "PKK0"}) {
    EXPECT_EQ(ExpandChecked(pc, {bad}), "!") << bad;
  }
}

}  // namespace

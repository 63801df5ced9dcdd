// The decoder of the streams, and the collecting of its output.
#include "package/expander.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "package/data_file.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/code_stream.h"
#include "tests/support/plain_expander.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

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

// The output, and "!" behind it when the sequence was found bad.
std::string Expand(const std::string& codes) {
  CollectingExpander expander;
  expander.Expand(codes);
  return expander.output + (expander.failed() != 0 ? "!" : "");
}

std::string ExpandCodes(const std::vector<uint32_t>& codes) {
  CodeStream stream;
  for (const uint32_t code : codes) stream.Put(code);
  return Expand(stream.Codes());
}

TEST(Expander, FollowsTheWorkedExample) {
  EXPECT_EQ(Expand("\x30\x98\xA0\x70\x50"), "abababa");
}

TEST(Expander, ACodeEqualToTheNextFreeOneRepeatsTheStringBefore) {
  EXPECT_EQ(ExpandCodes({97, 259}), "aaa");
  EXPECT_EQ(ExpandCodes({97, 98, 259, 261}), "abababa");
  EXPECT_EQ(ExpandCodes({97, 260}), "a!");
  EXPECT_EQ(ExpandCodes({97, 259, 261}), "aaa!");
}

TEST(Expander, OnlyALiteralStandsAtTheStartAndBehindAReset) {
  for (const uint32_t code : {256u, 257u, 258u, 259u, 511u}) {
    EXPECT_EQ(ExpandCodes({code, 97}), "!") << code;
    EXPECT_EQ(ExpandCodes({97, 258, code, 97}), "a!") << code;
  }
  EXPECT_EQ(ExpandCodes({0, 258, 255}), std::string("\0\xFF", 2));
}

TEST(Expander, AResetForgetsTheTableAndTheWidth) {
  EXPECT_EQ(ExpandCodes({97, 98, 259, 258, 99, 259}), "ababccc");
  EXPECT_EQ(ExpandCodes({97, 98, 259, 258, 99, 260}), "ababc!");
  // Read at the width in force; the code behind it has 9 bits again.
  EXPECT_EQ(ExpandCodes({97, 257, 257, 98, 258, 99, 100}), "abcd");
}

TEST(Expander, Code256HasNoMeaningAnywhere) {
  EXPECT_EQ(ExpandCodes({97, 256, 98}), "a!");
  EXPECT_EQ(ExpandCodes({97, 98, 99, 256}), "abc!");
}

TEST(Expander, WidthsEndAt32) {
  CodeStream widest;
  widest.Put('a').PutTimes(257, 32 - 9);
  ASSERT_EQ(widest.width(), 32u);
  EXPECT_EQ(Expand(CodeStream(widest).Put('b').Put(259).Codes()), "abab");
  EXPECT_EQ(Expand(CodeStream(widest).Put(0x80000061).Codes()), "a!");
  EXPECT_EQ(Expand(CodeStream(widest).Put(0xFFFFFFFF).Codes()), "a!");
  EXPECT_EQ(Expand(CodeStream(widest).Put(258).Put('b').Codes()), "ab");
  EXPECT_EQ(Expand(CodeStream(widest).Put(257).Codes()), "a!");
}

TEST(Expander, BitsThatMakeNoCodeAreDropped) {
  EXPECT_EQ(Expand(std::string("\x30", 1)), "");
  EXPECT_EQ(Expand("\x30\xFF"), "a");  // 7 bits are left over
  EXPECT_EQ(Expand(""), "");
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
    uint32_t strings = 0;
    bool grows = true;  // each string is one byte longer than the one before

   protected:
    void WriteOutput(const uint8_t*, uint32_t count) override { grows &= count == ++strings; }
  };
  CodeStream codes;
  codes.Put('a');
  for (uint32_t code = 259; code < 35023; ++code) {
    while (code >> codes.width() != 0) codes.Put(257);
    codes.Put(code);
  }
  const auto expander = std::make_unique<MeasuringExpander>();
  expander->Expand(codes.Codes());
  EXPECT_EQ(expander->failed(), 0);
  EXPECT_EQ(expander->strings, 34765u);
  EXPECT_TRUE(expander->grows);

  // One longer still is built before the table is found full.
  const auto full = std::make_unique<MeasuringExpander>();
  full->Expand(codes.Put(35023).Codes());
  EXPECT_EQ(full->failed(), 1);
  EXPECT_EQ(full->strings, 34765u);
}

TEST(Expander, AFailureIsFinal) {
  CollectingExpander expander;
  expander.Expand(CodeStream().Put('a').Put(300).Codes());
  EXPECT_EQ(expander.failed(), 1);
  expander.Expand(CodeStream().Put('b').Codes());
  EXPECT_EQ(expander.output, "a");
  EXPECT_EQ(expander.failed(), 1);
}

// The streams that the two decoders are compared over.

using Random = std::mt19937;

size_t Below(Random& random, size_t limit) {
  return random() % limit;
}

std::string RandomText(Random& random, size_t length, unsigned letters) {
  std::string text;
  while (length-- > 0) text += static_cast<char>(Below(random, letters));
  return text;
}

std::string PackedCodes(Random& random) {
  const unsigned letters = 1u << Below(random, 9);
  return PackStream(RandomText(random, Below(random, 20000), letters)).substr(kStreamMagicSize);
}

std::string DamagedCodes(Random& random) {
  std::string codes = PackedCodes(random);
  for (size_t flips = 1 + Below(random, 3); flips > 0; --flips) {
    char& byte = codes[Below(random, codes.size())];
    byte = static_cast<char>(byte ^ (1 << Below(random, 8)));
  }
  return codes;
}

// Codes that mostly have a meaning where they stand, with widths and resets in odd places.
std::string PlausibleCodes(Random& random) {
  CodeStream codes;
  size_t free = 258;  // the next free code, once the first code has been put
  for (size_t count = Below(random, 3000); count > 0; --count) {
    const size_t limit = std::min<size_t>(free + 1, size_t{1} << codes.width());
    const size_t kind = Below(random, 200);
    const bool isFirst = free == 258;
    const size_t code = isFirst                      ? Below(random, 256)
                        : kind < 3                   ? 257
                        : kind == 3                  ? 258
                        : kind < 100 || limit <= 259 ? Below(random, 256)
                                                     : 259 + Below(random, limit - 259);
    codes.Put(static_cast<uint32_t>(code));
    free = code == 258 ? 258 : free + (code != 257 ? 1 : 0);
  }
  return codes.Codes();
}

std::string RandomCodes(Random& random) {
  std::string codes = RandomText(random, 1 + Below(random, 200), 256);
  codes[0] = static_cast<char>(codes[0] & 0x7F);  // a literal comes first
  return codes;
}

TEST(Expander, AgreesWithAPlainDecoderWhateverTheStreamAndItsSplitting) {
  Random random(20011231);
  int failures = 0;
  for (int round = 0; round < 600; ++round) {
    std::string (*const makers[])(Random&) = {PackedCodes, DamagedCodes, PlausibleCodes,
                                              RandomCodes};
    const std::string codes = makers[round % 4](random);
    const PlainExpansion expected = PlainExpander::Expand(codes);
    failures += expected.failed ? 1 : 0;

    CollectingExpander expander;
    const size_t largest = 1 + Below(random, 40);
    for (size_t used = 0; used < codes.size();) {
      const std::string block = codes.substr(used, Below(random, largest + 1));
      expander.Expand(block);
      used += block.size();
    }
    ASSERT_EQ(expander.failed() != 0, expected.failed) << "round " << round;
    ASSERT_TRUE(expander.output == expected.bytes) << "round " << round;
  }
  // Both verdicts were met often.
  EXPECT_GT(failures, 100);
  EXPECT_LT(failures, 500);
}

class FileExpander : public ProductTest {
 protected:
  FileExpander() { EXPECT_EQ(file_.Create(), 1); }

  void TearDown() override {
    EXPECT_EQ(file_.Close(), 1);
    ProductTest::TearDown();
  }

  void Take(PkzFileExpander& expander, const std::string& block) {
    expander.ExpandBlock(BytesOf(block), static_cast<uint32_t>(block.size()));
  }

  // Sizes of the writes that the stream causes when it comes in blocks of 4 bytes.
  std::vector<uint32_t> WriteSizes(const std::string& stream) {
    PkzFileExpander expander(&file_);
    std::vector<uint32_t> sizes;
    uint32_t written = file_.GetSize();
    const auto note = [&] {
      if (file_.GetSize() == written) return;
      sizes.push_back(file_.GetSize() - written);
      written = file_.GetSize();
    };
    for (size_t used = 0; used < stream.size(); used += 4) {
      Take(expander, stream.substr(used, 4));
      note();
    }
    if (expander.bufferFill() > 0) expander.Flush();
    note();
    EXPECT_EQ(expander.failed(), 0);
    return sizes;
  }

  static std::string Literals(int count) { return CodeStream().PutTimes('x', count).Stream(); }

  DataFile file_{"C:\\out.bin"};
};

TEST_F(FileExpander, WritesFullBuffersWhenTheNextByteArrives) {
  using Sizes = std::vector<uint32_t>;
  EXPECT_EQ(WriteSizes(Literals(1)), (Sizes{1}));
  EXPECT_EQ(WriteSizes(Literals(1023)), (Sizes{1023}));
  EXPECT_EQ(WriteSizes(Literals(1024)), (Sizes{1024}));
  EXPECT_EQ(WriteSizes(Literals(1025)), (Sizes{1024, 1}));
  EXPECT_EQ(WriteSizes(Literals(3 * 1024)), (Sizes{1024, 1024, 1024}));
  EXPECT_EQ(WriteSizes(Literals(3 * 1024 + 7)), (Sizes{1024, 1024, 1024, 7}));
}

TEST_F(FileExpander, AStringLongerThanTheBufferGoesOutInFullBuffers) {
  CodeStream codes;
  codes.Put('a');
  for (uint32_t code = 259; code < 3000; ++code) {
    while (code >> codes.width() != 0) codes.Put(257);
    codes.Put(code);
  }
  const size_t total = 2742 * 2743 / 2;
  FailNothing();
  PkzFileExpander expander(&file_);
  Take(expander, codes.Stream());
  EXPECT_EQ(expander.bufferFill(), total % 1024);
  EXPECT_EQ(file_.GetSize(), total - total % 1024);
  EXPECT_EQ(machine::CallCount("WriteFile"), static_cast<int>(total / 1024));
  expander.Flush();
  EXPECT_TRUE(pc.Read("drive_c/out.bin") == std::string(total, 'a'));
}

TEST_F(FileExpander, TheFirstBlockHoldsTheMagicAndOneByteMore) {
  const std::string stream = CodeStream().Put('a').Put('b').Stream();
  struct Row {
    std::string first;
    std::string second;
    bool isGood;
  };
  const Row rows[] = {
      {stream.substr(0, 4), stream.substr(4), true},  {stream, "", true},
      {stream.substr(0, 3), stream.substr(3), false}, {"", stream, false},
      {"pkz" + stream.substr(3), "", false},          {"PKK" + stream.substr(3), stream, false},
  };
  for (const Row& row : rows) {
    PkzFileExpander expander(nullptr);
    Take(expander, row.first);
    Take(expander, row.second);
    EXPECT_EQ(expander.failed(), row.isGood ? 0 : 1) << row.first;
    EXPECT_EQ(expander.bufferFill(), row.isGood ? 2u : 0u) << row.first;
  }
}

TEST_F(FileExpander, AWriteThatFallsShortIsAFailure) {
  PkzFileExpander expander(&file_);
  FailCall("WriteFile", 2);
  Take(expander, Literals(2048));
  EXPECT_EQ(expander.failed(), 0);
  expander.Flush();
  EXPECT_EQ(expander.failed(), 1);
  Take(expander, CodeStream().PutTimes('x', 2000).Codes());
  EXPECT_EQ(expander.bufferFill(), 0u);
}

TEST_F(FileExpander, WithoutMemoryForTheTableItIsNotReady) {
  FailAllocation(1);
  EXPECT_FALSE(PkzFileExpander(&file_).IsReady());
  EXPECT_TRUE(PkzFileExpander(&file_).IsReady());
}

}  // namespace

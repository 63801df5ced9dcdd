// Streams of every way to pack: they expand to their file, have the shape that packers keep to, and
// are the shorter the harder they were worked for.

#include "tools/image/stream_packer.h"

#include <gtest/gtest.h>

#include <chrono>
#include <random>
#include <string>
#include <thread>

#include "tests/support/expander_check.h"
#include "tests/support/test_image.h"
#include "tools/image/parallel_packer.h"

namespace {

constexpr image::PackMethod kMethods[] = {image::kPackGreedily, image::kPackFast, image::kPackBest};

// Words of a made-up language, some much more frequent than others.
std::string Text(size_t size, unsigned seed) {
  std::mt19937 random(seed);
  std::string text;
  while (text.size() < size) {
    std::mt19937 word(random() % (1 + random() % 2000));
    for (auto length = 2 + word() % 9; length > 0; --length)
      text += static_cast<char>('a' + word() % 26 % (1 + word() % 26));
    text += ' ';
  }
  text.resize(size);
  return text;
}

// The first bytes of a sequence that has each pair of bytes once, so that n bytes take n codes.
std::string PairsOnce(size_t size) {
  std::string bytes;
  for (int first = 0; first < 256; ++first) {
    bytes += static_cast<char>(first);
    for (int second = first + 1; second < 256; ++second)
      bytes += {static_cast<char>(first), static_cast<char>(second)};
  }
  bytes.resize(size);
  return bytes;
}

// Expander and oracle make the file of it, and it keeps to what a packer of this house does: it is
// never wider than its codes need, and makes no entry beyond those of 15 bits.
void ExpectGood(const std::string& stream, const std::string& file) {
  EXPECT_TRUE(ExpandChecked(TestMachine(), {stream}) == file);
  unsigned width = 9;
  uint32_t nextFree = 258;
  bool isWidened = false;
  for (size_t bit = 24; stream.size() * 8 - bit >= width;) {
    uint32_t code = 0;
    for (const size_t end = bit + width; bit < end; ++bit)
      code = code << 1 | (unsigned{static_cast<uint8_t>(stream[bit / 8])} >> (7 - bit % 8) & 1u);
    ASSERT_TRUE(!isWidened || code == 257 || code >> (width - 1) != 0) << nextFree;
    isWidened = code == 257;
    width = code == 258 ? 9 : width + (code == 257 ? 1 : 0);
    nextFree = code == 258 ? 258 : nextFree + (code == 257 ? 0 : 1);
    ASSERT_LE(nextFree, 32767u);
  }
}

}  // namespace

TEST(StreamPacker, MakesTheseStreams) {
  for (const image::PackMethod& method : kMethods) {
    EXPECT_EQ(PackStream("abababa", method), "PKZ\x30\x98\xA0\x70\x50");
    EXPECT_EQ(PackStream("", method), std::string("PKZ\0", 4));
    EXPECT_EQ(PackStream("ab", method), "PKZ\x30\x98\x80");
  }
}

TEST(StreamPacker, MakesGoodStreamsOfEveryFile) {
  const std::string text = Text(150'000, 10);
  const struct {
    const char* what;
    std::string file;
    double usual, best;  // at most, against the file
  } rows[] = {
      {"zeros", std::string(1'000'000, '\0'), 0.002, 0.002},
      {"one code short of a full table", PairsOnce(32'508), 1.126, 1.126},
      {"a full table", PairsOnce(32'509), 1.126, 1.126},
      {"one code beyond", PairsOnce(32'510), 1.126, 1.126},
      {"random", RandomBytes(200'000, 1), 1.1251, 1.1251},
      {"text", text, 0.435, 0.435},
      {"random stretches in text",
       text + RandomBytes(12'000, 7) + text + RandomBytes(12'000, 9) + text, 0.47, 0.469},
      {"text in random bytes", RandomBytes(90'000, 3) + text + RandomBytes(90'000, 4), 0.815,
       0.815},
  };
  for (const auto& [what, file, usual, best] : rows) {
    SCOPED_TRACE(what);
    std::vector<double> sizes;
    for (const image::PackMethod& method : kMethods) {
      size_t told = 0;
      const std::string stream = PackStream(file, method, [&told](size_t count) { told += count; });
      EXPECT_EQ(told, file.size());
      ExpectGood(stream, file);
      sizes.push_back(double(stream.size()) / double(file.size()));
    }
    EXPECT_LE(sizes[1], usual);
    EXPECT_LE(sizes[2], best);
  }
}

// All jobs take three seconds; those that are begun when the first has failed, some milliseconds.
TEST(ParallelPacker, TellsAFailureAndLeavesOutWhatIsNotBegun) {
  constexpr size_t kJobs = 600;
  std::atomic<size_t> begun = 0;
  const auto pack = [&begun](size_t job) -> std::vector<uint8_t> {
    ++begun;
    if (job == 0) throw std::runtime_error("no");
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
    return {};
  };
  EXPECT_THROW(image::ParallelPacker(kJobs, pack, 2).Take(0), std::runtime_error);
  EXPECT_LT(begun, kJobs);
}

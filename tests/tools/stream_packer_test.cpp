// Streams of every way to pack: they expand to their file, have the shape that packers keep to, and
// are the shorter the harder they were worked for.

#include "tools/image/stream_packer.h"

#include <gtest/gtest.h>

#include <chrono>
#include <random>
#include <string>
#include <thread>

#include "tests/support/stream_oracle.h"
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

// It expands to the file. Code 257 stands where the next free code is the last that fits, and
// nowhere else; no entry is made beyond those of 15 bits, and an early reset stands in a planned
// stream alone.
void ExpectGood(const std::string& stream, const std::string& file, bool isPlanned = false) {
  StreamOracle oracle;
  oracle.Take(stream);
  EXPECT_TRUE(oracle.output == file && !oracle.failed());
  unsigned width = 9;
  uint32_t nextFree = 258;
  for (size_t bit = 24; stream.size() * 8 - bit >= width;) {
    uint32_t code = 0;
    for (const size_t end = bit + width; bit < end; ++bit)
      code = code << 1 | (unsigned{static_cast<uint8_t>(stream[bit / 8])} >> (7 - bit % 8) & 1u);
    const bool isLastThatFits = nextFree == (1u << width) - 1;
    ASSERT_EQ(code == 257, isLastThatFits && width < 15) << nextFree;
    ASSERT_TRUE(code == 258 ? isPlanned || nextFree == 32767 : nextFree != 32767) << nextFree;
    ASSERT_NE(code, 256u);
    width = code == 258 ? 9 : width + (code == 257 ? 1 : 0);
    nextFree = code == 258 ? 258 : nextFree + (code == 257 ? 0 : 1);
  }
}

}  // namespace

TEST(StreamPacker, PacksTheWorkedExampleAndTheEmptyFile) {
  for (const image::PackMethod& method : kMethods) {
    EXPECT_EQ(PackStream("abababa", method), "PKZ\x30\x98\xA0\x70\x50");
    EXPECT_EQ(PackStream("", method), std::string("PKZ\0", 4));
  }
}

TEST(StreamPacker, MakesGoodStreamsOfEveryFile) {
  const std::string files[] = {std::string(1, '\0'), std::string(1'000'000, '\0'),
                               RandomBytes(200'000, 1), Text(700'000, 2),
                               Text(130'000, 6) + RandomBytes(12'000, 7) + Text(100'000, 8) +
                                   RandomBytes(12'000, 9) + Text(150'000, 10)};
  for (const std::string& file : files) {
    SCOPED_TRACE(std::to_string(file.size()) + " bytes");
    std::vector<size_t> sizes;
    for (const image::PackMethod& method : kMethods) {
      size_t told = 0;
      const std::string stream = PackStream(file, method, [&told](size_t count) { told += count; });
      EXPECT_EQ(told, file.size());
      ExpectGood(stream, file, method.plansLives);
      sizes.push_back(stream.size());
    }
    EXPECT_LE(sizes[2], sizes[1]);
    if (&file != std::end(files) - 1) continue;
    // Where the kind of bytes changes, more work makes streams shorter by 2% each.
    EXPECT_LT(sizes[1], sizes[0] - sizes[0] / 50);
    EXPECT_LT(sizes[2], sizes[1] - sizes[1] / 50);
  }
}

TEST(StreamPacker, EndsWellAroundEachWideningAndReset) {
  for (const size_t limit : {511u, 1023u, 2047u, 4095u, 8191u, 16383u, 32767u}) {
    // Behind limit - 258 codes the next free code is `limit`.
    for (size_t size = limit - 258 - 2; size <= limit - 258 + 2; ++size) {
      SCOPED_TRACE(size);
      ExpectGood(PackStream(PairsOnce(size), image::kPackFast), PairsOnce(size));
    }
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

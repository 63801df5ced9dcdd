// The packers of streams on files of many kinds of bytes: what they make expands to the file, and
// is never above 1.126 times its size and a few bytes.
//
// Each three bytes of the input make a stretch of the file: how many values its bytes have, less 1;
// the first value; the length in units of 128 bytes.
#include <random>

#include "tests/fuzz/fuzz_target.h"
#include "tests/support/expander_check.h"
#include "tests/support/test_image.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  constexpr size_t kMostBytes = 200'000;
  std::string_view input = TextOf(data, size);
  std::minstd_rand random;
  std::string file;
  while (!input.empty() && file.size() < kMostBytes) {
    const auto values = 1u + TakeByte(&input);
    const unsigned first = TakeByte(&input);
    for (size_t left = 128u * TakeByte(&input); left > 0; --left)
      file += static_cast<char>(first + (random() >> 8) % values);
  }
  for (const image::PackMethod& method : {image::kPackFast, image::kPackBest}) {
    const std::string stream = PackStream(file, method);
    EXPECT_LE(stream.size(), file.size() * 1126 / 1000 + 4);
    EXPECT_TRUE(ExpandChecked(pc, {stream}) == file);
  }
  return 0;
}

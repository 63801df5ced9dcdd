// The yardstick of the packer: packs files by plain greedy LZW and prints the bytes of all streams
// together.
#include <cstdio>

#include "tools/image/input_file.h"
#include "tools/image/stream_packer.h"

int main(int argc, char** argv) {
  constexpr uint64_t kLargestFile = 1u << 30;
  size_t total = 0;
  for (int i = 1; i < argc; ++i) {
    const auto file = image::ReadWholeFile(argv[i], kLargestFile);
    total += image::PackStream(file, image::kPackGreedily).size();
  }
  std::printf("%zu\n", total);
  return 0;
}

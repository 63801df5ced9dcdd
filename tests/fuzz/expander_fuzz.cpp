// The expander against the reader of the tools, both fed with the same blocks: the same bytes, the
// same verdict and the right writes at the end of each block; once more with a write that fails.
//
//   0     bit 0: the rest holds codes of 16 bits, which are put at the width then in force, so that
//         the engine need not find the widths; else it is the code sequence itself
//         bit 1: literals come first that nearly fill the table
//   1     number of block sizes, 0 to 15: the low half
//   2...  block sizes, used in turn; then the rest
#include <algorithm>
#include <vector>

#include "tests/fuzz/fuzz_target.h"
#include "tests/support/code_stream.h"
#include "tests/support/expander_check.h"

namespace {

constexpr int kLiterals = 34704;  // whole bytes of 9-bit codes; 60 entries stay free

std::string CodesOf(std::string_view units) {
  CodeStream stream;
  for (size_t i = 0; i + 1 < units.size() && stream.width() <= 32; i += 2) {
    const unsigned unit =
        static_cast<uint8_t>(units[i]) | unsigned{static_cast<uint8_t>(units[i + 1])} << 8;
    stream.Put(unit & ((1u << std::min(stream.width(), 16u)) - 1));
  }
  return stream.Codes();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  static const std::string literals = CodeStream().PutTimes('a', kLiterals).Codes();
  std::string_view input = TextOf(data, size);
  const uint8_t how = TakeByte(&input);
  std::vector<size_t> sizes(TakeByte(&input) & 15);
  for (size_t& blockSize : sizes) blockSize = TakeByte(&input);
  if (std::ranges::count(sizes, size_t{0}) == std::ssize(sizes)) sizes = {255};
  const std::string codes = (how & 1) != 0 ? CodesOf(input) : std::string(input);
  const auto blocks = SplitStream(codes, sizes, (how & 2) != 0 ? literals : "");
  const size_t writes = ExpandChecked(pc, blocks).size() / 1024;
  if (writes > 0) ExpandChecked(pc, blocks, (writes + 1) / 2);
  return 0;
}

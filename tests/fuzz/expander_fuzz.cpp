// The expander against the plain decoder, both fed with the same blocks: the same bytes, the same
// verdict and the same writes at the end of each block.
//
//   0     bit 0: the rest holds codes of 16 bits, which are put at the width then in force, so that
//         the engine need not find the widths; else it is the code sequence itself
//         bit 1: literals come first that nearly fill the table
//   1     number of block sizes, 0 to 15: the low half
//   2...  block sizes, used in turn; then the rest
#include <algorithm>
#include <memory>
#include <vector>

#include "machine/faults.h"
#include "package/data_file.h"
#include "package/expander.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/code_stream.h"
#include "tests/support/plain_expander.h"
#include "tests/support/test_machine.h"

namespace {

constexpr size_t kOutputLimit = 1 << 20;
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

// Appends blocks of the sizes in turn; an empty block is one too.
void Split(std::string_view codes, std::vector<uint8_t> sizes, std::vector<std::string>* blocks) {
  if (std::count(sizes.begin(), sizes.end(), 0) == std::ssize(sizes)) sizes = {255};
  for (size_t turn = 0; !codes.empty(); ++turn) {
    blocks->emplace_back(codes.substr(0, sizes[turn % sizes.size()]));
    codes.remove_prefix(blocks->back().size());
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  static const std::string literals = CodeStream().PutTimes('a', kLiterals).Codes();
  FuzzInput input(data, size);
  const uint8_t how = input.TakeByte();
  std::vector<uint8_t> blockSizes(input.TakeByte() & 15);
  for (uint8_t& blockSize : blockSizes) blockSize = input.TakeByte();
  const std::string codes = (how & 1) != 0 ? CodesOf(input.rest()) : std::string(input.rest());
  std::vector<std::string> blocks;
  if ((how & 2) != 0) blocks.push_back(literals);
  Split(codes, blockSizes, &blocks);

  DataFile file("C:\\out.bin");
  EXPECT_EQ(file.Create(), 1);
  machine::SetFaults({});  // counts calls from 0
  const auto expected = std::make_unique<RecordingPlainExpander>();
  const auto expander = std::make_unique<PkzFileExpander>(&file);
  std::string magic = kStreamMagic;  // stands in the first block, with one byte more at least
  for (const std::string& block : blocks) {
    if (expected->output.size() > kOutputLimit) break;
    if (!magic.empty() && block.empty()) continue;
    const std::string stored = magic + block;
    magic.clear();
    const auto* const bytes = reinterpret_cast<const uint8_t*>(stored.data());
    expected->ExpandBlock(bytes, static_cast<uint32_t>(stored.size()));
    expander->ExpandBlock(bytes, static_cast<uint32_t>(stored.size()));
    EXPECT_EQ(expander->failed(), expected->failed());
    EXPECT_EQ(expander->bufferFill(), expected->bufferFill());
    EXPECT_EQ(machine::CallCount("WriteFile"), expected->writes);
    EXPECT_EQ(file.GetSize(), expected->output.size());
  }
  expander->Flush();
  expected->Flush();
  EXPECT_EQ(file.Close(), 1);
  EXPECT_TRUE(pc.Read("drive_c/out.bin") == expected->output);
  return 0;
}

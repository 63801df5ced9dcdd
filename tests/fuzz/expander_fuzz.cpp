// The expander against the plain decoder: the same bytes, the same verdict and writes of 1024
// bytes, however the stream is split.
//
//   0     bit 0: the rest holds codes of 16 bits, which are put at the width then in force, so that
//         the engine need not find the widths; else it is the code sequence itself
//         bit 1: literals come first that nearly fill the table
//   1     number of block sizes, 0 to 15: the low half
//   2...  block sizes, used in turn; then the rest
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
constexpr uint32_t kBufferSize = 1024;
constexpr int kLiterals = 34704;  // whole bytes of 9-bit codes; 60 entries stay free

class CollectingExpander : public PkzExpander {
 public:
  std::string output;

 protected:
  void WriteOutput(const uint8_t* bytes, uint32_t count) override {
    output.append(reinterpret_cast<const char*>(bytes), count);
  }
};

std::string CodesOf(std::string_view units) {
  CodeStream stream;
  for (size_t i = 0; i + 1 < units.size() && stream.width() <= 32; i += 2) {
    const unsigned unit =
        static_cast<uint8_t>(units[i]) | unsigned{static_cast<uint8_t>(units[i + 1])} << 8;
    stream.Put(unit & ((1u << std::min(stream.width(), 16u)) - 1));
  }
  return stream.Codes();
}

const uint8_t* BytesOf(std::string_view text) {
  return reinterpret_cast<const uint8_t*>(text.data());
}

// The full buffers that have gone out when so many bytes have come: the last one waits.
uint32_t FullWrites(size_t bytes) {
  return bytes == 0 ? 0 : static_cast<uint32_t>((bytes - 1) / kBufferSize);
}

// Of the sizes in turn; an empty block is one too.
std::vector<std::string> Split(std::string_view codes, std::vector<uint8_t> sizes) {
  if (std::count(sizes.begin(), sizes.end(), 0) == std::ssize(sizes)) sizes = {255};
  std::vector<std::string> blocks;
  for (size_t turn = 0; !codes.empty(); ++turn) {
    blocks.emplace_back(codes.substr(0, sizes[turn % sizes.size()]));
    codes.remove_prefix(blocks.back().size());
  }
  return blocks;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  static const std::string literals = CodeStream().PutTimes('a', kLiterals).Codes();
  FuzzInput input(data, size);
  const uint8_t how = input.TakeByte();
  std::vector<uint8_t> blockSizes(input.TakeByte() & 15);
  for (uint8_t& blockSize : blockSizes) blockSize = input.TakeByte();
  std::string codes = (how & 1) != 0 ? CodesOf(input.rest()) : std::string(input.rest());
  std::vector<std::string> blocks = Split(codes, blockSizes);
  if ((how & 2) != 0) {
    codes = literals + codes;
    blocks.insert(blocks.begin(), literals);
  }
  const PlainExpansion expected = PlainExpander::Expand(codes, kOutputLimit);
  if (expected.bytes.size() > kOutputLimit) return 0;

  const auto collecting = std::make_unique<CollectingExpander>();
  DataFile file("C:\\out.bin");
  EXPECT_EQ(file.Create(), 1);
  machine::SetFaults({});  // counts calls from 0
  const auto writing = std::make_unique<PkzFileExpander>(&file);
  std::string magic = kStreamMagic;  // stands in the first block, with one byte more at least
  for (const std::string& block : blocks) {
    collecting->Expand(BytesOf(block), static_cast<uint32_t>(block.size()));
    if (!magic.empty() && block.empty()) continue;
    const std::string stored = magic + block;
    magic.clear();
    writing->ExpandBlock(BytesOf(stored), static_cast<uint32_t>(stored.size()));

    const size_t done = collecting->output.size();
    EXPECT_EQ(writing->failed(), collecting->failed());
    EXPECT_EQ(machine::CallCount("WriteFile"), static_cast<int>(FullWrites(done)));
    EXPECT_EQ(writing->bufferFill(), done - FullWrites(done) * kBufferSize);
  }
  EXPECT_EQ(collecting->failed() != 0, expected.failed);
  EXPECT_TRUE(collecting->output == expected.bytes);
  EXPECT_EQ(file.GetSize(), FullWrites(expected.bytes.size()) * kBufferSize);
  if (writing->bufferFill() > 0) writing->Flush();
  EXPECT_EQ(file.Close(), 1);
  EXPECT_TRUE(pc.Read("drive_c/out.bin") == expected.bytes);
  return 0;
}

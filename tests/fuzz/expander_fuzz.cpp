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

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const TestMachine pc;
  FuzzInput input(data, size);
  const uint8_t how = input.TakeByte();
  std::vector<uint8_t> blockSizes(input.TakeByte() & 15);
  for (uint8_t& blockSize : blockSizes) blockSize = input.TakeByte();
  if (blockSizes.empty()) blockSizes = {255};
  static const std::string literals = CodeStream().PutTimes('a', kLiterals).Codes();
  const std::string codes = ((how & 2) != 0 ? literals : "") +
                            ((how & 1) != 0 ? CodesOf(input.rest()) : std::string(input.rest()));
  const PlainExpansion expected = PlainExpander::Expand(codes, kOutputLimit);
  if (expected.bytes.size() > kOutputLimit) return 0;

  const auto collecting = std::make_unique<CollectingExpander>();
  DataFile file("C:\\out.bin");
  EXPECT_EQ(file.Create(), 1);
  machine::SetFaults({});  // counts calls from 0
  const auto writing = std::make_unique<PkzFileExpander>(&file);
  std::string block = kStreamMagic;  // goes out with the first byte of the sequence
  for (size_t used = 0, turn = 0; used < codes.size(); ++turn) {
    const std::string part = codes.substr(used, blockSizes[turn % blockSizes.size()]);
    used += part.size();
    if (part.empty() && turn >= blockSizes.size() && used == 0) return 0;  // every size is 0
    collecting->Expand(BytesOf(part), static_cast<uint32_t>(part.size()));
    block += part;
    if (used == 0) continue;
    writing->ExpandBlock(BytesOf(block), static_cast<uint32_t>(block.size()));
    block.clear();

    const size_t done = collecting->output.size();
    EXPECT_EQ(writing->failed(), collecting->failed());
    EXPECT_EQ(machine::CallCount("WriteFile"), static_cast<int>(FullWrites(done)));
    EXPECT_EQ(file.GetSize(), FullWrites(done) * kBufferSize);
    EXPECT_EQ(writing->bufferFill(), done - FullWrites(done) * kBufferSize);
  }
  EXPECT_EQ(collecting->failed() != 0, expected.failed);
  EXPECT_TRUE(collecting->output == expected.bytes);
  if (writing->bufferFill() > 0) writing->Flush();
  EXPECT_EQ(file.Close(), 1);
  EXPECT_TRUE(pc.Read("drive_c/out.bin") == expected.bytes);
  return 0;
}

// The program's expander, held against the oracle block by block.
#pragma once

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "machine/faults.h"
#include "package/data_file.h"
#include "package/expander.h"
#include "tests/support/stream_oracle.h"
#include "tests/support/test_machine.h"

// Expands a stream to C:\out.bin. After each block both have the same verdict and the same bytes,
// and of these just so many are written: a write has 1024 bytes and waits for the next byte.
// The n-th write fails, 0 for none: nothing follows it but the rest of the same code's text.
// Returns what is in the file, and "!" behind it after a failure.
inline std::string ExpandChecked(const TestMachine& pc, const std::vector<std::string>& blocks,
                                 size_t failingWrite = 0) {
  constexpr size_t kWrite = 1024;
  constexpr size_t kMostOutput = 1 << 20;
  DataFile file("C:\\out.bin");
  EXPECT_EQ(file.Create(), 1);
  machine::SetFaults({});  // counts the calls from 0
  if (failingWrite > 0)
    machine::SetFaults({{.function = "WriteFile", .call = static_cast<int>(failingWrite)}});

  StreamOracle oracle;
  const auto expander = std::make_unique<PkzFileExpander>(&file);
  size_t writes = 0;
  bool isStruck = false;
  for (const std::string& block : blocks) {
    oracle.Take(block);
    expander->ExpandBlock(reinterpret_cast<const uint8_t*>(block.data()),
                          static_cast<uint32_t>(block.size()));
    const auto struck = std::ranges::upper_bound(oracle.ends, failingWrite * kWrite);
    isStruck = failingWrite > 0 && struck != oracle.ends.end();
    const size_t taken = isStruck ? *struck : oracle.output.size();
    writes = taken > 0 ? (taken - 1) / kWrite : 0;
    EXPECT_EQ(expander->failed() != 0, isStruck || oracle.failed());
    EXPECT_EQ(machine::CallCount("WriteFile"), static_cast<int>(writes));
    EXPECT_EQ(file.GetSize(), (writes - (isStruck ? 1 : 0)) * kWrite);
    EXPECT_TRUE(isStruck || expander->bufferFill() == taken - writes * kWrite);
    if (oracle.output.size() > kMostOutput || testing::Test::HasFailure()) break;
  }
  std::string written = oracle.output.substr(0, writes * kWrite);
  if (isStruck) {
    written.erase((failingWrite - 1) * kWrite, kWrite);
  } else {
    expander->Flush();
    const bool isLastStruck = failingWrite == writes + 1;
    EXPECT_EQ(expander->failed() != 0, isLastStruck || oracle.failed());
    if (!isLastStruck) written = oracle.output;
  }
  machine::SetFaults({});
  EXPECT_EQ(file.Close(), 1);
  const std::string bytes = pc.Read("drive_c/out.bin");
  EXPECT_TRUE(bytes == written) << bytes.size() << " bytes, not " << written.size();
  return bytes + (expander->failed() != 0 ? "!" : "");
}

// A stream in blocks of these sizes, in turn. The first block holds the magic besides, and one byte
// more at least, or these codes alone.
inline std::vector<std::string> SplitStream(std::string_view codes,
                                            const std::vector<size_t>& sizes,
                                            const std::string& firstBlock = "") {
  std::vector<std::string> blocks = {kStreamMagic + firstBlock};
  for (size_t turn = 0; !codes.empty(); ++turn) {
    const std::string_view block = codes.substr(0, sizes[turn % sizes.size()]);
    codes.remove_prefix(block.size());
    blocks.back() == kStreamMagic ? blocks.back() += block : blocks.emplace_back(block);
  }
  return blocks;
}

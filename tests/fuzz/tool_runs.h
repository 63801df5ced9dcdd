// moriv-image in the fuzzer's own process, in one folder for all inputs, beside the sample.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "tests/fuzz/fuzz_target.h"
#include "tests/tools/tool_bench.h"

class ToolRuns : public SampleBench {
 public:
  using SampleBench::NamesIn;
  using SampleBench::Write;

  // The exit status, which must be one that the tool has, with a message for a failure.
  int Run(const std::vector<std::string>& arguments) const {
    const ToolRun run = SampleBench::Run(arguments);
    EXPECT_TRUE(run.status == 0 || run.status == 1 || run.status == 2) << run.status;
    EXPECT_EQ(run.status == 2, !run.err.empty()) << run.err;
    return run.status;
  }

  // Takes away what runs have made.
  void Remove(const std::vector<std::string>& names) const {
    for (const std::string& name : names) std::filesystem::remove_all(Host(name));
  }

 private:
  void TestBody() override {}
};

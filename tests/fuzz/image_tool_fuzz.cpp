// moriv-image on hostile images: it leaves no half-written file, what it prints is printable or
// JSON, and what it verifies as good can be listed, compared and trimmed.
//
//   0     not read: the input has the form of the whole image's, and its corpus is of use here
//   1...  the package
#include <nlohmann/json.hpp>

#include "tests/fuzz/fuzz_target.h"
#include "tests/tools/tool_bench.h"
#include "tools/terminal/printable_text.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const SampleBench bench;
  const std::string package(data + std::min<size_t>(size, 1), data + size);
  bench.Write("image.exe", VersionedProgram("4.1.7") + package);
  const std::vector<std::string> before = bench.NamesIn("");
  const auto isDone = [](const char* commandLine) {
    const ToolRun run = bench.Run(commandLine);
    EXPECT_EQ(terminal::PrintableLines(run.out), run.out);
    return run.status == 0;
  };
  const bool isGood = isDone("verify @image.exe");
  EXPECT_EQ(isDone("verify --quiet @image.exe"), isGood);
  const bool isListed = isDone("list @image.exe");
  EXPECT_TRUE(isListed || !isGood);
  EXPECT_EQ(nlohmann::json::accept(bench.Run("list --json @image.exe").out), isListed);
  EXPECT_TRUE(isDone("diff @image.exe @image.exe") || !isGood);
  (void)isDone("extract @image.exe -o @out");
  (void)isDone("extract @image.exe -o @tree --tree");
  const bool isTrimmed = isDone("removal @image.exe -o @removal.exe");
  EXPECT_TRUE(!isGood || !isTrimmed || isDone("verify @removal.exe"));
  for (const char* made : {"out", "tree", "removal.exe"})
    std::filesystem::remove_all(bench.Host(made));
  EXPECT_EQ(bench.NamesIn(""), before);
  return 0;
}

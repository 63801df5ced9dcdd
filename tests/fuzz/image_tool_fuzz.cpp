// moriv-image on hostile images: it leaves no half-written file, and what it verifies as good can
// be listed and trimmed.
//
//   0     not read: the input has the form of the whole image's, and its corpus is of use here
//   1...  the package
#include "tests/fuzz/tool_runs.h"
#include "tests/support/test_image.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::string executable = VersionedProgram("4.1.7");
  static const ToolRuns tool;
  FuzzInput input(data, size);
  (void)input.TakeByte();
  tool.Write("image.exe", executable + std::string(input.rest()));

  const bool isGood = tool.Run({"verify", "@image.exe"}) == 0;
  const bool isListed = tool.Run({"list", "@image.exe"}) == 0;
  const bool isExtracted = tool.Run({"extract", "@image.exe", "-o", "@out"}) == 0;
  const bool isTrimmed = tool.Run({"removal", "@image.exe", "-o", "@removal.exe"}) == 0;
  std::vector<std::string> names = {"image.exe"};
  if (isExtracted) names.emplace_back("out");
  if (isTrimmed) names.emplace_back("removal.exe");
  EXPECT_EQ(tool.NamesIn(""), names);
  EXPECT_TRUE(isListed || !isGood);
  EXPECT_TRUE(!isTrimmed || !isGood || tool.Run({"verify", "@removal.exe"}) == 0);
  tool.Remove({"out", "removal.exe"});
  return 0;
}

// moriv-image on hostile images: it leaves no half-written file, and what it verifies as good can
// be listed and trimmed.
//
//   0     not read: the input has the form of the whole image's, and its corpus is of use here
//   1...  the package
#include "tests/fuzz/tool_runs.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::string executable = VersionedProgram("4.1.7");
  static const ToolRuns tool;
  FuzzInput input(data, size);
  (void)input.TakeByte();
  tool.Write("image.exe", executable + std::string(input.rest()));
  const std::vector<std::string> before = tool.NamesIn("");

  const bool isGood = tool.Run({"verify", "@image.exe"}) == 0;
  const bool isListed = tool.Run({"list", "@image.exe"}) == 0;
  const bool isExtracted = tool.Run({"extract", "@image.exe", "-o", "@out"}) == 0;
  const bool isTrimmed = tool.Run({"removal", "@image.exe", "-o", "@removal.exe"}) == 0;
  EXPECT_TRUE(isListed || !isGood);
  EXPECT_TRUE(!isTrimmed || !isGood || tool.Run({"verify", "@removal.exe"}) == 0);
  if (isExtracted) tool.Remove({"out"});
  if (isTrimmed) tool.Remove({"removal.exe"});
  EXPECT_EQ(tool.NamesIn(""), before);
  return 0;
}

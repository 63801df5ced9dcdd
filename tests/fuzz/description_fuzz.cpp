// moriv-image pack on hostile descriptions: a failure leaves nothing behind, and what is packed is
// an image that verifies. A space_needed of the description's own may be another than verify asks
// for.
//
// The input is the TOML text. Of the files that it can name there are stub.exe, a.exe, b.dll and
// empty.txt.
#include "tests/fuzz/tool_runs.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const ToolRuns tool;
  const std::string text(data, data + size);
  tool.Write("fuzz.toml", text);
  const std::vector<std::string> before = tool.NamesIn("");
  const bool isPacked =
      tool.Run({"pack", "@fuzz.toml", "--stub", "@stub.exe", "-o", "@packed.exe"}) == 0;
  if (isPacked) {
    const bool isGood = tool.Run({"verify", "@packed.exe"}) == 0;
    EXPECT_TRUE(isGood || text.find("space_needed") != std::string::npos);
    EXPECT_EQ(tool.Run({"list", "@packed.exe"}), 0);
    tool.Remove({"packed.exe"});
  }
  EXPECT_EQ(tool.NamesIn(""), before);
  return 0;
}

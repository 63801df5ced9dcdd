// moriv-image pack on hostile descriptions: what is packed is an image that verifies, and nothing
// else is left. A space_needed of the description's own may be another than verify asks for.
//
// The input is the TOML text. Of the files that it can name there are stub.exe, a.exe, b.dll and
// empty.txt.
#include "tests/fuzz/fuzz_target.h"
#include "tests/tools/tool_bench.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const SampleBench bench;
  const std::string text(data, data + size);
  const bool searches = text.find_first_of("*?") != text.npos || text.find("tree") != text.npos;
  // One that searches elsewhere could go through the whole host.
  if (searches && (text.find('/') != text.npos || text.find("..") != text.npos)) return 0;
  bench.Write("fuzz.toml", text);
  const std::vector<std::string> before = bench.NamesIn("");
  if (bench.Pack("@fuzz.toml").status == 0) {
    const bool isGood = bench.Run("verify @new.exe").status == 0;
    EXPECT_TRUE(isGood || text.find("space_needed") != std::string::npos);
    EXPECT_EQ(bench.Run("list @new.exe").status, 0);
    std::filesystem::remove(bench.Host("new.exe"));
  }
  EXPECT_EQ(bench.NamesIn(""), before);
  return 0;
}

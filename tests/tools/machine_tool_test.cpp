// moriv-machine: new, show and restart.

#include <string>

#include "tests/tools/tool_bench.h"
#include "tools/machine/machine_command_line.h"

namespace {

class MachineTool : public ToolBench {
 protected:
  ToolRun Run(const std::vector<std::string>& arguments) const {
    return ToolBench::Run(arguments, machine_tool::RunMachineTool);
  }
};

void ExpectIn(const std::string& text, std::initializer_list<const char*> parts) {
  for (const char* part : parts) EXPECT_NE(text.find(part), std::string::npos) << part << text;
}

}  // namespace

TEST_F(MachineTool, MakesAMachineThatItShows) {
  const ToolRun made = Run({"new", "@pc", "--platform", "9x", "--language", "0x040c"});
  ASSERT_EQ(made.status, 0) << made.err;
  ExpectIn(Read("pc/machine.ini"), {"platform = 9x\n", "language = 1036\n"});

  Write("pc/drive_c/windows/Report.TXT", "12345");
  std::filesystem::permissions(Host("pc/drive_c/windows/Report.TXT"),
                               std::filesystem::perms::owner_read);
  const ToolRun all = Run({"show", "@pc"});
  ASSERT_EQ(all.status, 0) << all.err;
  ExpectIn(all.out, {"AR            5  C:\\windows\\Report.TXT\n", "<DIR>  C:\\windows\\system32\n",
                     "REGEDIT4\n", "no C:\\windows\\MorivLog.txt\n"});
  EXPECT_LT(all.out.find("C:\\Program Files"), all.out.find("C:\\windows"));

  Write("pc/drive_c/windows/morivlog.TXT", "caf\xE9\r\nend\r\n");
  EXPECT_EQ(Run({"show", "@pc", "log"}).out, "caf\xC3\xA9\nend\n");
  EXPECT_EQ(Run({"restart", "@pc"}).status, 0);  // nothing waits
}

TEST_F(MachineTool, RefusesWhatIsNoMachineOrIsOneAlready) {
  using Arguments = std::vector<std::string>;
  std::filesystem::create_directory(Host("empty"));
  ASSERT_EQ(Run({"new", "@pc"}).status, 0);
  ASSERT_EQ(Run({"new", "@bad"}).status, 0);
  Write("bad/machine.ini", "[system]\ncolour = 3\n");
  for (const Arguments& arguments : {Arguments{"new", "@pc"},
                                     {"new", "@pc2", "--platform", "os2"},
                                     {"new", "@pc2", "--language", "65536"},
                                     {"show", "@empty"},
                                     {"show", "@missing"},
                                     {"show", "@pc", "disks"},
                                     {"restart", "@empty"},
                                     {"restart"},
                                     {"show", "@bad"},
                                     {}}) {
    ExpectRefused(Run(arguments));
  }
  EXPECT_TRUE(NamesIn("empty").empty());
}

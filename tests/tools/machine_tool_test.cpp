// moriv-machine: new, show and restart.

#include "tests/tools/tool_bench.h"
#include "tools/machine/machine_command_line.h"

struct MachineTool : ToolBench {
  MachineTool() { tool = machine_tool::RunMachineTool; }
};

TEST_F(MachineTool, MakesAMachineThatItShows) {
  ASSERT_EQ(Run("new @pc --platform 9x --language 0x040c").status, 0);
  for (const char* line : {"\nplatform = 9x\n", "\nlanguage = 1036\n"})
    EXPECT_NE(Read("pc/machine.ini").find(line), std::string::npos) << line;

  Write("pc/drive_c/windows/Report.TXT", "12345");
  std::filesystem::permissions(Host("pc/drive_c/windows/Report.TXT"),
                               std::filesystem::perms::owner_read);
  const std::string all = Run("show @pc").out;
  size_t last = 0;
  for (const char* part :
       {"<DIR>  C:\\Program Files\n", "AR            5  C:\\windows\\Report.TXT\n",
        "<DIR>  C:\\windows\\system32\n", "REGEDIT4\n", "no C:\\windows\\MorivLog.txt\n"}) {
    const size_t place = all.find(part, last);
    ASSERT_NE(place, std::string::npos) << part << " is missing or not in its turn\n" << all;
    last = place;
  }
  Write("pc/drive_c/windows/morivlog.TXT", "caf\xE9\r\nend\r\n");
  EXPECT_EQ(Run("show @pc log").out, "caf\xC3\xA9\nend\n");
  EXPECT_EQ(Run("restart @pc").status, 0);  // nothing waits

  Write("half/machine.ini", "");
  for (const char* commandLine : {"show @half", "restart @half"})
    EXPECT_EQ(Run(commandLine).status, 0);
  EXPECT_EQ(NamesIn("half").size(), 1u);  // nothing was made
}

TEST_F(MachineTool, RefusesWhatIsNoMachineOrIsOneAlready) {
  std::filesystem::create_directory(Host("empty"));
  ASSERT_EQ(Run("new @pc").status, 0);
  ASSERT_EQ(Run("new @bad").status, 0);
  Write("bad/machine.ini", "[system]\ncolour = 3\n");
  for (const char* commandLine :
       {"new @pc", "new @pc2 --platform os2", "new @pc2 --language 65536", "show @empty",
        "show @missing", "show @pc disks", "restart @empty", "restart @missing", "restart",
        "show @bad", ""}) {
    ExpectRefused(Run(commandLine));
  }
  EXPECT_TRUE(NamesIn("empty").empty());
}

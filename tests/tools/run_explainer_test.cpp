// What moriv-image explain says: every exit code has its words, in every form that tools show, and
// a log is judged by its last run. Which event goes with which code is held against the scenarios
// (tests/player/explained_log.py).

#include "tools/image/run_explainer.h"

#include <cstdio>
#include <fstream>

#include "tests/tools/tool_bench.h"
#include "tools/image/run_outcomes.h"

namespace {

using RunExplainer = ToolBench;

TEST_F(RunExplainer, HasWordsForEveryStatus) {
  std::ifstream header(MORIV_SOURCE_DIR "/src/core/status.h");
  size_t declared = 0;
  for (std::string line; std::getline(header, line);) {
    char name[32] = {};
    int code = 0;
    constexpr char kDeclaration[] = "inline constexpr StatusCode %31[A-Za-z] = %d;";
    if (std::sscanf(line.c_str(), kDeclaration, name, &code) != 2) continue;
    ++declared;
    const image::RunOutcome* outcome = image::FindRunOutcome(code);
    ASSERT_NE(outcome, nullptr) << line;
    EXPECT_STREQ(outcome->name, name);
    EXPECT_STRNE(outcome->meaning, "");
    EXPECT_STRNE(outcome->remedy, "");
  }
  // 0, after the help, is no status.
  EXPECT_EQ(image::RunOutcomes().size(), declared + 1);
}

TEST_F(RunExplainer, TakesACodeInEveryForm) {
  for (const char* code : {"-1000020", "4293967276", "0xFFF0BDAC", "0xfff0bdac"}) {
    const ToolRun run = RunImage({"explain", code});
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(
        run.out.starts_with("exit code   -1000020 = 4293967276 = 0xFFF0BDAC, StatusNoDiskSpace\n"
                            "meaning     The package needs more bytes than are free."))
        << code << run.out;
  }
  for (const char* code :
       {"100003", "2", "-1000022", "4294967296", "-2147483649", "0x", "0x-1", "1x", ""}) {
    ExpectRefused(RunImage({"explain", code}));
  }
}

TEST_F(RunExplainer, JudgesTheLastRunOfALog) {
  const std::string heading =
      "\r\n\r\nInstalling Moriv : Monday, 01 June 2026 at : 01h 02m 03s \r\n\r\n";
  const std::string failed = heading +
                             "1- Fatal Error : Error copying destination file :  C:\\\xE9. \r\n\r\n"
                             " (Application will exit)\r\n";
  const std::string removed = heading +
                              "1- Unistalling Moriv from the system \r\n"
                              "2- Moriv registration removed from the registry \r\n";
  Write("removed", failed + removed);
  EXPECT_EQ(RunImage({"explain", "@removed"}).out,
            "run         Monday, 01 June 2026 at : 01h 02m 03s\n"
            "event       2- Moriv registration removed from the registry\n"
            "exit code   1 = 0x00000001, StatusOk\n"
            "meaning     Success: all is done.\n"
            "to do       Nothing.\n");
  Write("failed", removed + failed);
  const std::string told = RunImage({"explain", "@failed"}).out;
  EXPECT_NE(told.find("1- Fatal Error : Error copying destination file :  C:\\é.\n"
                      "exit code   -1000021 "),
            std::string::npos)
      << told;
  Write("text", "1- Fatal Error : Cannot allocate memory . \r\n");
  ExpectRefused(RunImage({"explain", "@text"}), "no log of the setup program");
}

}  // namespace

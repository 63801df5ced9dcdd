// What moriv-image explain says: every exit code has its words, in every form that tools show, and
// a log is judged by its last run. Which event goes with which code is held against the scenarios
// (tests/player/explained_log.py) and the fault loops.

#include "tools/image/run_explainer.h"

#include <iostream>
#include <nlohmann/json.hpp>
#include <regex>

#include "tests/support/documented_codes.h"
#include "tests/tools/tool_bench.h"
#include "tools/image/run_outcomes.h"

namespace {

using RunExplainer = ToolBench;

// The header declares it, the document has it in its table, and the tool has words for it.
TEST_F(RunExplainer, KnowsEveryStatusAsItIsDocumented) {
  const std::string header = FileBytes(MORIV_SOURCE_DIR "/src/core/status.h");
  const std::string document = FileBytes(MORIV_SOURCE_DIR "/docs/exit-codes.md");
  const std::regex declaration("StatusCode (Status\\w+) = (-?\\d+);"), row("\n\\|[^`\n]+`Status");
  using Matches = std::sregex_iterator;
  const auto rows = std::distance(Matches(document.begin(), document.end(), row), Matches());
  // One more: 0, after the help, is no status.
  EXPECT_EQ(std::ssize(image::RunOutcomes()), rows + 1);
  ptrdiff_t declared = 0;
  for (Matches at(header.begin(), header.end(), declaration); at != Matches(); ++at, ++declared) {
    const std::string name = (*at)[1], code = (*at)[2];
    EXPECT_TRUE(DocumentedCode(std::stoi(code)).starts_with(name + "` | ")) << name;
    EXPECT_NE(Run(std::string("explain ") + code).out.find(", " + name + "\nmeaning     "),
              std::string::npos);
  }
  EXPECT_EQ(declared, rows);
  for (const image::RunOutcome& outcome : image::RunOutcomes())
    EXPECT_TRUE(*outcome.meaning != '\0' && *outcome.remedy != '\0') << outcome.code;
}

TEST_F(RunExplainer, TakesACodeInEveryForm) {
  for (const char* code : {"-1000020", "4293967276", "0xFFF0BDAC", "0xfff0bdac"}) {
    const ToolRun run = Run(std::string("explain ") + code);
    EXPECT_EQ(run.status, 0) << run.err;
    EXPECT_TRUE(
        run.out.starts_with("exit code   -1000020 = 4293967276 = 0xFFF0BDAC, StatusNoDiskSpace\n"
                            "meaning     The package needs more bytes than are free."))
        << code << run.out;
  }
  for (const char* code :
       {"100003", "2", "-1000022", "4294967296", "-2147483649", "0x", "0x-1", "1x"}) {
    ExpectRefused(Run(std::string("explain ") + code));
  }
  EXPECT_FALSE(image::ParseExitCode(""));
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
  EXPECT_EQ(Run("explain @removed").out,
            "run         Monday, 01 June 2026 at : 01h 02m 03s\n"
            "event       2- Moriv registration removed from the registry\n"
            "exit code   1 = 0x00000001, StatusOk\n"
            "meaning     Success: all is done.\n"
            "to do       Nothing.\n");
  Write("failed", removed + failed);
  const std::string told = Run("explain @failed").out;
  EXPECT_NE(told.find("1- Fatal Error : Error copying destination file :  C:\\é.\n"
                      "exit code   -1000021 "),
            std::string::npos)
      << told;
  std::string wide;
  for (const char c : failed) wide += {c, '\0'};
  const std::pair<std::string, const char*> rows[] = {
      {"1- Fatal Error : Cannot allocate memory . \r\n", "no log of the setup program"},
      {"\xFF\xFE" + wide, "UTF-16"},
      {wide, "UTF-16"},
      {VersionedProgram("1.0") + failed, "is a program"},
      {"\x7F"
       "ELF" +
           failed,
       "is a program"},
  };
  for (const auto& [text, said] : rows) {
    Write("text", text);
    ExpectRefused(Run("explain @text"), said);
  }
  // A whole one says nothing of it; a cut one, wherever it is cut.
  EXPECT_EQ(told.find("cut short"), std::string::npos);
  for (const size_t left : {3u, 26u, 29u, 60u, 90u}) {
    Write("cut", removed + failed.substr(0, failed.size() - left));
    EXPECT_NE(Run("explain @cut").out.find("log         cut short"), std::string::npos) << left;
  }
  std::istringstream log(failed);
  std::streambuf* const usual = std::cin.rdbuf(log.rdbuf());
  EXPECT_EQ(Run("explain -").out, told);
  std::cin.rdbuf(usual);
}

TEST_F(RunExplainer, TellsWhatIsNotTheSetupPrograms) {
  for (const char* code : {"5", "259", "740", "1223", "1602", "1618", "3010"}) {
    const std::string told = Run(std::string("explain ") + code).out;
    EXPECT_NE(told.find(", not the setup program's\nmeaning     "), std::string::npos) << told;
    const auto answer = nlohmann::json::parse(Run(std::string("explain --json ") + code).out);
    EXPECT_EQ(answer.at("outcomes").at(0).at("exitCode"), std::stoi(code));
    EXPECT_EQ(answer.at("outcomes").at(0).at("isForeign"), true);
  }
}

}  // namespace

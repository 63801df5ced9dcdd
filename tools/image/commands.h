// The commands of moriv-image, each in a file of its own: its options, and what it does with them.
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace image {

// What a command reads from and writes to, and what the tool is to end with when nothing is thrown.
struct CommandRun {
  std::istream& in;
  std::ostream& out;
  int status = 0;
  std::vector<std::string> warnings;  // lines for standard error, told when nothing is thrown
};

inline constexpr int kWouldFail = 1;       // plan: the run would end with another code than 1
inline constexpr int kFoundDifferent = 1;  // verify found something wrong, diff found a difference
inline constexpr int kBadInput = 2;

// Each adds one command to the tool. The command is carried out while the command line is read, and
// throws for input that it can't take: BadInput, BadInputs or another std::exception with a text
// for people.
//   run  outlives the tool
void AddPackCommand(CLI::App* tool, CommandRun* run);
void AddListCommand(CLI::App* tool, CommandRun* run);
void AddVerifyCommand(CLI::App* tool, CommandRun* run);
void AddExtractCommand(CLI::App* tool, CommandRun* run);
void AddRemovalCommand(CLI::App* tool, CommandRun* run);
void AddDiffCommand(CLI::App* tool, CommandRun* run);
void AddExplainCommand(CLI::App* tool, CommandRun* run);
void AddPlanCommand(CLI::App* tool, CommandRun* run);

}  // namespace image

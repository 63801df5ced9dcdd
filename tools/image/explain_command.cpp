#include <CLI/CLI.hpp>
#include <memory>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/host_text.h"
#include "tools/image/run_explainer.h"
#include "tools/image/run_outcomes.h"

namespace image {

void AddExplainCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command = tool->add_subcommand("explain", "Say how a run ended, and what to do");
  const auto end = std::make_shared<std::string>();
  command->add_option("CODE|LOG", *end, "Exit code, signed, unsigned or 0x..., or a log file")
      ->required();
  command->callback([end, run] {
    const std::optional<StatusCode> code = ParseExitCode(*end);
    run->out << (code ? ExplainExitCode(*code) : ExplainLog(PathOf(*end)));
  });
}

}  // namespace image

#include <CLI/CLI.hpp>
#include <istream>
#include <memory>
#include <nlohmann/json.hpp>
#include <ostream>

#include "tools/image/bad_input.h"
#include "tools/image/commands.h"
#include "tools/image/host_text.h"
#include "tools/image/input_file.h"
#include "tools/image/json_output.h"
#include "tools/image/run_explainer.h"
#include "tools/image/run_outcomes.h"

namespace image {
namespace {

constexpr uint64_t kLogLimit = 64 << 20;  // bytes; a report file grows with each run

struct ExplainOrder {
  std::string end;  // exit code or log
  bool isJson = false;
};

std::vector<uint8_t> ReadStandardInput(std::istream& in) {
  std::vector<uint8_t> bytes;
  char block[65536];
  while (bytes.size() <= kLogLimit && (in.read(block, sizeof block), in.gcount() > 0)) {
    bytes.insert(bytes.end(), block, block + in.gcount());
  }
  if (bytes.size() <= kLogLimit) return bytes;
  throw BadInput("-", "has more than " + std::to_string(kLogLimit) + " bytes");
}

RunExplanation Explain(const std::string& end, std::istream& in) {
  if (const std::optional<StatusCode> code = ParseExitCode(end)) return ExplainExitCode(*code);
  const std::vector<uint8_t> log =
      end == "-" ? ReadStandardInput(in) : ReadWholeFile(PathOf(end), kLogLimit);
  try {
    return ExplainLog(log);
  } catch (const std::runtime_error& error) {
    throw BadInput(PathOf(end), error.what());
  }
}

}  // namespace

void AddExplainCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command = tool->add_subcommand("explain", "Say how a run ended, and what to do");
  const auto order = std::make_shared<ExplainOrder>();
  command
      ->add_option("CODE|LOG", order->end,
                   "Exit code, signed, unsigned or 0x..., or a log file; - is standard input")
      ->required();
  AddJsonFlag(command, &order->isJson);
  command->callback([order, run] {
    const RunExplanation explanation = Explain(order->end, run->in);
    if (order->isJson) {
      PrintJson(*run, AsJson(explanation));
    } else {
      run->out << Describe(explanation);
    }
  });
}

}  // namespace image

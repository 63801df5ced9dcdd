#include <memory>
#include <nlohmann/json.hpp>
#include <ostream>
#include <stdexcept>

#include "tools/image/commands.h"
#include "tools/image/json_output.h"
#include "tools/image/path_option.h"
#include "tools/planner/child_process.h"
#include "tools/planner/plan_report.h"
#include "tools/planner/run_planner.h"
#include "tools/planner/throwaway_folder.h"

namespace image {
namespace {

struct PlanCommand {
  PlanOrder order;
  std::filesystem::path machine;
  bool isJson = false;
};

// The plan as text, made where the machine that it needs dies with its process.
ChildAnswer MakePlan(const PlanCommand& command, const std::filesystem::path& folder) {
  ChildProcess planner([&command, &folder](const std::string&, std::string* text) {
    const RunPlan plan = PlanRun(command.order, folder);
    *text = command.isJson ? JsonText(PlanAsJson(plan)) : ShowPlan(plan);
    return plan.exitCode == StatusOk ? 0 : kWouldFail;
  });
  return planner.Ask();
}

void Plan(const PlanCommand& command, CommandRun* run) {
  const ThrowawayFolder folder;
  const ChildAnswer answer = MakePlan(command, folder.Path());
  if (answer.status == ChildProcess::kFailed) throw std::runtime_error(answer.output);
  if (answer.status < 0) throw std::runtime_error("the run on the copy has crashed");
  run->out << answer.output;
  run->status = answer.status;
}

}  // namespace

void AddPlanCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* add = tool->add_subcommand("plan", "Say what a silent run would do, and do nothing");
  const auto command = std::make_shared<PlanCommand>();
  AddPathOption(add, "IMAGE", &command->order.image, "Image")->required();
  add->add_option("--dir", command->order.directory, "Installation directory, as /d: gives it");
  CLI::Option* const machine = AddPathOption(add, "--machine", &command->machine,
                                             "Folder of a stand-in machine, if not a fresh one");
  add->add_flag("--remove", command->order.remove, "A removal, as with /u");
  add->add_option("--options", command->order.options,
                  "More options of the run, as one text: \"/r /GER\"");
  AddJsonFlag(add, &command->isJson);
  add->callback([command, machine, run] {
    if (machine->count() > 0) command->order.machine = command->machine;
    Plan(*command, run);
  });
}

}  // namespace image

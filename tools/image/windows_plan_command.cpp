#include <CLI/CLI.hpp>
#include <stdexcept>

#include "tools/image/commands.h"

namespace image {

// What a plan lets run is the native setup program on a stand-in machine.
void AddPlanCommand(CLI::App* tool, CommandRun*) {
  CLI::App* command = tool->add_subcommand("plan", "Not on Windows: moriv-image for Linux has it");
  command->allow_extras();
  command->callback([] {
    throw std::runtime_error("plan is not on Windows; use moriv-image on Linux, under WSL as well");
  });
}

}  // namespace image

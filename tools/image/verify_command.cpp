#include <memory>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/image_verifier.h"
#include "tools/image/path_option.h"

namespace image {

void AddVerifyCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command =
      tool->add_subcommand("verify", "Check all that the setup program takes on trust");
  const auto image = std::make_shared<std::filesystem::path>();
  AddPathOption(command, "IMAGE", image.get(), "Image")->required();
  command->callback([image, run] {
    for (const Finding& finding : VerifyImage(*image)) {
      run->out << (finding.isGood ? "ok     " : "wrong  ") << finding.text << '\n';
      if (!finding.isGood) run->status = kFoundDifferent;
    }
  });
}

}  // namespace image

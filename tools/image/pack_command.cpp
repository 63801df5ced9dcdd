#include <memory>

#include "tools/image/commands.h"
#include "tools/image/image_builder.h"
#include "tools/image/path_option.h"

namespace image {

void AddPackCommand(CLI::App* tool, CommandRun*) {
  CLI::App* command = tool->add_subcommand("pack", "Make an image of a setup program and files");
  const auto order = std::make_shared<PackOrder>();
  AddPathOption(command, "PACKAGE", &order->description, "TOML file that describes the package")
      ->required();
  AddPathOption(command, "--stub", &order->stub, "Setup program without a package")->required();
  AddOutputOption(command, &order->output, "Image to write");
  AddPathOption(command, "--source-dir", &order->sourceFolder,
                "Folder of the files, if not PACKAGE's");
  command->add_flag("--allow-unknown-macros", order->allowUnknownMacros,
                    "Take %...% words that are no macro as names");
  command->add_flag("--best", order->best, "Make the image as small as can be; takes much longer");
  command->callback([order] { PackImage(*order); });
}

}  // namespace image

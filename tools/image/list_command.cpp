#include <memory>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/image_listing.h"
#include "tools/image/path_option.h"

namespace image {

void AddListCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command = tool->add_subcommand("list", "Show what an image holds");
  const auto image = std::make_shared<std::filesystem::path>();
  AddPathOption(command, "IMAGE", image.get(), "Image")->required();
  command->callback([image, run] { run->out << ListImage(*image); });
}

}  // namespace image

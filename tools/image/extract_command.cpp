#include <memory>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/image_extractor.h"
#include "tools/image/path_option.h"
#include "tools/terminal/printable_text.h"

namespace image {

void AddExtractCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command = tool->add_subcommand("extract", "Expand the files of an image");
  const auto order = std::make_shared<ExtractOrder>();
  AddPathOption(command, "IMAGE", &order->image, "Image")->required();
  command->add_option("NAME", order->names,
                      "Files to expand, by name or as #2 by number, if not all");
  AddPathOption(command, "-o,--output", &order->folder, "Folder to write to")->required();
  command->add_flag("--tree", order->isTree, "Make folders for the first place of each file");
  command->add_flag("--force", order->replaceExisting, "Replace files that exist");
  command->callback([order, run] {
    for (const auto& path : ExtractImage(*order))
      run->out << terminal::Printable(TextOf(path)) << '\n';
  });
}

}  // namespace image

#include <memory>

#include "tools/image/commands.h"
#include "tools/image/language_names.h"
#include "tools/image/path_option.h"
#include "tools/image/removal_image.h"

namespace image {
namespace {

struct RemovalOrder {
  std::filesystem::path image;
  std::filesystem::path output;
  std::string language;
};

void WriteRemoval(const RemovalOrder& order) {
  std::optional<int32_t> language;
  if (!order.language.empty()) {
    language = FindLanguage(order.language);
    if (!language) {
      throw CLI::ValidationError("--language", std::string("is to be ") + kLanguageNames);
    }
  }
  WriteRemovalImage(order.image, order.output, language);
}

}  // namespace

void AddRemovalCommand(CLI::App* tool, CommandRun*) {
  CLI::App* command =
      tool->add_subcommand("removal", "Make the removal program that an install would write");
  const auto order = std::make_shared<RemovalOrder>();
  AddPathOption(command, "IMAGE", &order->image, "Setup image")->required();
  AddPathOption(command, "-o,--output", &order->output, "Removal program to write")->required();
  command->add_option("--language", order->language, std::string(kLanguageNames) + ", or a number");
  command->callback([order] { WriteRemoval(*order); });
}

}  // namespace image

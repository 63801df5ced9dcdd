#include <memory>
#include <nlohmann/json.hpp>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/image_listing.h"
#include "tools/image/json_output.h"
#include "tools/image/path_option.h"

namespace image {
namespace {

struct ListOrder {
  std::filesystem::path image;
  bool isJson = false;
};

}  // namespace

void AddListCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command = tool->add_subcommand("list", "Show what an image holds");
  const auto order = std::make_shared<ListOrder>();
  AddPathOption(command, "IMAGE", &order->image, "Image")->required();
  AddJsonFlag(command, &order->isJson);
  command->callback([order, run] {
    if (order->isJson) {
      PrintJson(*run, ListImageAsJson(order->image));
    } else {
      run->out << ListImage(order->image);
    }
  });
}

}  // namespace image

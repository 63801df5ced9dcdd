// A path on the tool's command line.
#pragma once

#include <CLI/CLI.hpp>

#include "tools/image/host_text.h"

namespace image {

// As CLI::App::add_option does it for a text; `path` outlives the command. An option takes no "-":
// nothing is written to standard output, or read from elsewhere, for it.
inline CLI::Option* AddPathOption(CLI::App* command, const std::string& name,
                                  std::filesystem::path* path, const std::string& description) {
  return command->add_option_function<std::string>(
      name,
      [path, name](const std::string& text) {
        if (text == "-" && name.starts_with('-')) {
          throw CLI::ValidationError(name, "\"-\" is no file; name one (./- is one of that name)");
        }
        *path = PathOf(text);
      },
      description);
}

}  // namespace image

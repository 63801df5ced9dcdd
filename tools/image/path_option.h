// A path on the tool's command line.
#pragma once

#include <CLI/CLI.hpp>
#include <vector>

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

// The same for one path or more.
inline CLI::Option* AddPathsOption(CLI::App* command, const std::string& name,
                                   std::vector<std::filesystem::path>* paths,
                                   const std::string& description) {
  return command->add_option_function<std::vector<std::string>>(
      name,
      [paths](const std::vector<std::string>& texts) {
        for (const std::string& text : texts) paths->push_back(PathOf(text));
      },
      description);
}

}  // namespace image

// A path on the tool's command line.
#pragma once

#include <CLI/CLI.hpp>
#include <vector>

#include "tools/image/host_text.h"

namespace image {

// As CLI::App::add_option does it for a text; `path` outlives the command.
inline CLI::Option* AddPathOption(CLI::App* command, const std::string& name,
                                  std::filesystem::path* path, const std::string& description) {
  return command->add_option_function<std::string>(
      name, [path](const std::string& text) { *path = PathOf(text); }, description);
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

// -o: what the command writes. Standard output, which "-" means elsewhere, takes none of it.
inline CLI::Option* AddOutputOption(CLI::App* command, std::filesystem::path* path,
                                    const std::string& description) {
  return AddPathOption(command, "-o,--output", path, description)
      ->required()
      ->check([](const std::string& text) {
        return text == "-" ? "can't be standard output; name a file or a folder" : "";
      });
}

}  // namespace image

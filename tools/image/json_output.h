// The output of a command as JSON: one object, for programs to read.
#pragma once

#include <nlohmann/json_fwd.hpp>
#include <string>

namespace CLI {
class App;
}

namespace image {

struct CommandRun;
using Json = nlohmann::ordered_json;  // keys stay in the order in which they are set

// Adds --json to a command; `isAsked` outlives it.
void AddJsonFlag(CLI::App* command, bool* isAsked);

// In UTF-8, over several lines. All that a terminal could take for more than text is escaped.
std::string JsonText(const Json& object);
void PrintJson(const CommandRun& run, const Json& object);

}  // namespace image

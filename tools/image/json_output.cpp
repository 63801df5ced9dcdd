#include "tools/image/json_output.h"

#include <CLI/CLI.hpp>
#include <nlohmann/json.hpp>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/terminal/printable_text.h"

namespace image {

void AddJsonFlag(CLI::App* command, bool* isAsked) {
  command->add_flag("--json", *isAsked, "Print one JSON object, for programs to read");
}

// The library leaves characters above C0 as they are; what Printable makes of them is an escape of
// JSON too. Bytes that are no UTF-8 stand in paths of the host at most.
std::string JsonText(const Json& object) {
  const std::string text = object.dump(2, ' ', false, Json::error_handler_t::replace);
  return terminal::PrintableLines(text) + '\n';
}

void PrintJson(const CommandRun& run, const Json& object) {
  run.out << JsonText(object);
}

}  // namespace image

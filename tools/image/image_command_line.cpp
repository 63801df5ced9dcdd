#include "tools/image/image_command_line.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <exception>
#include <ostream>
#include <string>

#include "tools/image/commands.h"

namespace image {
namespace {

constexpr auto kCommands = {AddPackCommand,    AddListCommand,    AddVerifyCommand,
                            AddExtractCommand, AddRemovalCommand, AddExplainCommand,
                            AddPlanCommand};

// One line, whatever names the text quotes.
void Tell(std::ostream& err, std::string text) {
  std::replace_if(
      text.begin(), text.end(), [](char c) { return c >= 0 && c < ' '; }, ' ');
  err << "moriv-image: " << text << '\n';
}

}  // namespace

int RunImageTool(int argc, const char* const* argv, std::ostream& out, std::ostream& err) {
  CLI::App tool("Makes, shows, checks and unpacks setup images, and explains how runs ended.",
                "moriv-image");
  CommandRun run{out};
  tool.require_subcommand(1);
  for (const auto add : kCommands) add(&tool, &run);
  try {
    tool.parse(argc, argv);
    out.flush();
    if (!out) throw std::runtime_error("the output can't be written");
    return run.status;
  } catch (const CLI::CallForHelp& help) {
    return tool.exit(help, out, err);
  } catch (const CLI::CallForAllHelp& help) {
    return tool.exit(help, out, err);
  } catch (const CLI::ParseError& error) {
    Tell(err, std::string(error.what()) + "; see moriv-image --help");
  } catch (const std::bad_alloc&) {
    Tell(err, "not enough memory");
  } catch (const std::exception& error) {
    Tell(err, error.what());
  }
  return kBadInput;
}

}  // namespace image

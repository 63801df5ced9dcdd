#include "tools/image/image_command_line.h"

#include <CLI/CLI.hpp>
#include <exception>
#include <iostream>
#include <memory>
#include <string>

#include "tools/image/bad_input.h"
#include "tools/image/commands.h"
#include "tools/terminal/printable_text.h"

namespace image {
namespace {

constexpr auto kCommands = {AddPackCommand,    AddListCommand, AddVerifyCommand,  AddExtractCommand,
                            AddRemovalCommand, AddDiffCommand, AddExplainCommand, AddPlanCommand};

// One line, whatever names the text quotes.
void Tell(std::ostream& err, const std::string& text) {
  err << "moriv-image: " << terminal::Printable(text) << '\n';
}

std::runtime_error UnknownCommand(const std::string& name) {
  return std::runtime_error("unknown command \"" + name + "\"; see moriv-image --help");
}

// The command stands first; the parser would take a misspelt one for a surplus argument.
void RequireKnownCommand(const CLI::App& tool, const std::string& word) {
  if (word.empty() || word.starts_with('-')) return;
  for (const CLI::App* command : tool.get_subcommands(nullptr)) {
    if (command->get_name() == word) return;
  }
  throw UnknownCommand(word);
}

void AddHelpCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* help = tool->add_subcommand("help", "Tell the options of a command");
  const auto name = std::make_shared<std::string>();
  help->add_option("COMMAND", *name, "The command; without it, all commands are told");
  // Once it has a command, the tool takes a question for its help for that command's.
  help->callback([tool, name, run, all = tool->help()] {
    if (!name->empty()) RequireKnownCommand(*tool, *name);
    run->out << (name->empty() ? all : tool->get_subcommand(*name)->help("moriv-image"));
  });
}

}  // namespace

int RunImageTool(int argc, const char* const* argv, std::ostream& out, std::ostream& err) {
  CLI::App tool(
      "Makes, shows, checks, compares and unpacks setup images, and explains how runs ended.",
      "moriv-image");
  CommandRun run{std::cin, out, 0, {}};
  tool.require_subcommand(1);
  tool.allow_windows_style_options(false);  // a path may begin with a slash
  tool.set_version_flag("--version", "moriv-image " MORIV_VERSION);
  for (const auto add : kCommands) add(&tool, &run);
  AddHelpCommand(&tool, &run);
  try {
    RequireKnownCommand(tool, argc > 1 ? argv[1] : "");
    tool.parse(argc, argv);
    out.flush();
    if (!out) throw std::runtime_error("the output can't be written");
    for (const std::string& warning : run.warnings) Tell(err, "warning: " + warning);
    return run.status;
  } catch (const CLI::CallForHelp& help) {
    return tool.exit(help, out, err);
  } catch (const CLI::CallForVersion& version) {
    return tool.exit(version, out, err);
  } catch (const CLI::CallForAllHelp& help) {
    return tool.exit(help, out, err);
  } catch (const CLI::ParseError& error) {
    Tell(err, std::string(error.what()) + "; see moriv-image --help");
  } catch (const BadInputs& faults) {
    for (const std::string& line : faults.Lines()) Tell(err, line);
  } catch (const std::bad_alloc&) {
    Tell(err, "not enough memory");
  } catch (const std::exception& error) {
    Tell(err, error.what());
  }
  return kBadInput;
}

}  // namespace image

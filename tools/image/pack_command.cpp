#include <cstdio>
#include <memory>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/image_builder.h"
#include "tools/image/path_option.h"
#include "tools/image/record_text.h"

namespace image {
namespace {

struct PackCommand {
  PackOrder order;
  bool isVerbose = false;
  bool isQuiet = false;
};

// What is left of a size, "64.2 %"; "-" of nothing.
std::string Ratio(uint64_t stored, uint64_t size) {
  if (size == 0) return "-";
  char text[32];
  std::snprintf(text, sizeof text, "%.1f %%",
                100 * static_cast<double>(stored) / static_cast<double>(size));
  return text;
}

std::string RowOf(uint64_t size, uint64_t stored) {
  char text[80];
  std::snprintf(text, sizeof text, "%10llu -> %10llu  %8s", static_cast<unsigned long long>(size),
                static_cast<unsigned long long>(stored), Ratio(stored, size).c_str());
  return text;
}

void Tell(const PackReport& report, const PackCommand& command, std::ostream& out) {
  uint64_t size = 0;
  uint64_t stored = 0;
  for (const PackReport::File& file : report.files) {
    size += file.size;
    stored += file.stored;
    if (!command.isVerbose) continue;
    out << RowOf(file.size, file.stored) << "  " << Shown(file.name) << "  "
        << Shown(file.destination) << '\n';
  }
  out << RowOf(size, stored) << "  " << report.files.size()
      << (report.files.size() == 1 ? " file, " : " files, ") << report.imageSize
      << " bytes of image\n";
}

}  // namespace

void AddPackCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command = tool->add_subcommand("pack", "Make an image of a setup program and files");
  const auto pack = std::make_shared<PackCommand>();
  PackOrder& order = pack->order;
  AddPathOption(command, "PACKAGE", &order.description, "TOML file that describes the package")
      ->required();
  AddPathOption(command, "--stub", &order.stub, "Setup program without a package")->required();
  AddPathOption(command, "-o,--output", &order.output, "Image to write")->required();
  AddPathOption(command, "--source-dir", &order.sourceFolder,
                "Folder of the files, if not PACKAGE's");
  AddPathOption(command, "--depfile", &order.makeRule,
                "File to write a rule for make into, with all that the image is made of");
  command->add_flag("--allow-unknown-macros", order.allowUnknownMacros,
                    "Take %...% words that are no macro, and lone % signs, as names");
  command->add_flag("--best", order.best, "Make the image as small as can be; takes much longer");
  CLI::Option* verbose = command->add_flag("--verbose", pack->isVerbose, "Report each file");
  command->add_flag("--quiet", pack->isQuiet, "Report nothing")->excludes(verbose);
  command->callback([pack, run] {
    const PackReport report = PackImage(pack->order);
    run->warnings = report.warnings;
    if (!pack->isQuiet) Tell(report, *pack, run->out);
  });
}

}  // namespace image

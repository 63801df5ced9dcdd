#include <memory>
#include <nlohmann/json.hpp>
#include <ostream>
#include <vector>

#include "tools/image/commands.h"
#include "tools/image/image_verifier.h"
#include "tools/image/json_output.h"
#include "tools/image/path_option.h"
#include "tools/terminal/printable_text.h"

namespace image {
namespace {

struct VerifyOptions {
  std::vector<std::filesystem::path> images;
  std::filesystem::path description;
  std::filesystem::path sourceFolder;
  bool isQuiet = false;
  bool isJson = false;

  VerifyOrder OrderOf(const std::filesystem::path& image) const {
    return {image, description, sourceFolder};
  }
  bool IsTold(const Finding& finding) const {
    return !isQuiet || finding.kind == Finding::Kind::kWrong;
  }
};

std::string DescribeFinding(const Finding& finding) {
  const char* const words[] = {"ok     ", "wrong  ", "note   "};
  return words[static_cast<size_t>(finding.kind)] + finding.part +
         (finding.text.empty() ? "" : ": " + finding.text);
}

Json FindingAsJson(const Finding& finding) {
  const char* const kinds[] = {"ok", "wrong", "note"};
  return {{"kind", kinds[static_cast<size_t>(finding.kind)]},
          {"part", finding.part},
          {"text", finding.text}};
}

std::string DescribeCount(const VerifyOptions& options, const PartCount& count) {
  const size_t images = options.images.size();
  return (images > 1 ? std::to_string(images) + " images, " : "") + std::to_string(count.parts) +
         (count.parts == 1 ? " part, " : " parts, ") +
         (count.wrong == 0 ? "none" : std::to_string(count.wrong)) + " wrong\n";
}

PartCount VerifyForPeople(const VerifyOptions& options, std::ostream& out) {
  PartCount all;
  for (const std::filesystem::path& image : options.images) {
    const std::string behind =
        options.images.size() > 1 ? "  in " + terminal::Printable(TextOf(image)) : "";
    const PartCount count = VerifyImage(options.OrderOf(image), [&](const Finding& finding) {
      if (options.IsTold(finding)) out << DescribeFinding(finding) << behind << '\n';
    });
    all.parts += count.parts;
    all.wrong += count.wrong;
  }
  out << DescribeCount(options, all);
  return all;
}

PartCount VerifyForPrograms(const VerifyOptions& options, const CommandRun& run) {
  PartCount all;
  Json images = Json::array();
  for (const std::filesystem::path& image : options.images) {
    Json findings = Json::array();
    const PartCount count = VerifyImage(options.OrderOf(image), [&](const Finding& finding) {
      if (options.IsTold(finding)) findings.push_back(FindingAsJson(finding));
    });
    images.push_back({{"image", TextOf(image)},
                      {"parts", count.parts},
                      {"wrong", count.wrong},
                      {"findings", findings}});
    all.parts += count.parts;
    all.wrong += count.wrong;
  }
  PrintJson(run, {{"parts", all.parts}, {"wrong", all.wrong}, {"images", images}});
  return all;
}

void Verify(const VerifyOptions& options, CommandRun* run) {
  if (!options.description.empty() && options.images.size() > 1) {
    throw CLI::ValidationError("--against", "goes with one image");
  }
  const PartCount count =
      options.isJson ? VerifyForPrograms(options, *run) : VerifyForPeople(options, run->out);
  if (count.wrong > 0) run->status = kFoundDifferent;
}

}  // namespace

void AddVerifyCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command =
      tool->add_subcommand("verify", "Check all that the setup program takes on trust");
  const auto options = std::make_shared<VerifyOptions>();
  AddPathsOption(command, "IMAGE", &options->images, "Image, or several")->required();
  CLI::Option* against =
      AddPathOption(command, "--against", &options->description,
                    "Compare with the sources of this package description as well");
  AddPathOption(command, "--source-dir", &options->sourceFolder,
                "Folder of the sources, if not the description's")
      ->needs(against);
  command->add_flag("-q,--quiet", options->isQuiet, "Print only what is wrong, and the last line");
  AddJsonFlag(command, &options->isJson);
  command->callback([options, run] { Verify(*options, run); });
}

}  // namespace image

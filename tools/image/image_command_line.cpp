#include "tools/image/image_command_line.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <exception>
#include <ostream>
#include <string>

#include "tools/image/image_builder.h"
#include "tools/image/image_extractor.h"
#include "tools/image/image_listing.h"
#include "tools/image/image_verifier.h"
#include "tools/image/language_names.h"
#include "tools/image/removal_image.h"
#include "tools/image/run_explainer.h"
#include "tools/image/run_outcomes.h"

namespace image {
namespace {

constexpr int kFoundWrong = 1;
constexpr int kBadInput = 2;

struct RemovalOrder {
  std::string image;
  std::string output;
  std::string language;
};

class ImageTool {
 public:
  explicit ImageTool(std::ostream& out) : out_(out) {
    app_.require_subcommand(1);
    AddPack();
    AddList();
    AddVerify();
    AddExtract();
    AddRemoval();
    AddExplain();
  }

  int Run(int argc, const char* const* argv, std::ostream& err) {
    try {
      app_.parse(argc, argv);
      out_.flush();
      if (!out_) throw std::runtime_error("the output can't be written");
      return status_;
    } catch (const CLI::CallForHelp& help) {
      return app_.exit(help, out_, err);
    } catch (const CLI::CallForAllHelp& help) {
      return app_.exit(help, out_, err);
    } catch (const CLI::ParseError& error) {
      Tell(err, std::string(error.what()) + "; see moriv-image --help");
    } catch (const std::bad_alloc&) {
      Tell(err, "not enough memory");
    } catch (const std::exception& error) {
      Tell(err, error.what());
    }
    return kBadInput;
  }

 private:
  // One line, whatever names the text quotes.
  static void Tell(std::ostream& err, std::string text) {
    std::replace_if(
        text.begin(), text.end(), [](char c) { return c >= 0 && c < ' '; }, ' ');
    err << "moriv-image: " << text << '\n';
  }

  void AddPack() {
    CLI::App* command = app_.add_subcommand("pack", "Make an image of a setup program and files");
    command->add_option("PACKAGE", pack_.description, "TOML file that describes the package")
        ->required();
    command->add_option("--stub", pack_.stub, "Setup program without a package")->required();
    command->add_option("-o,--output", pack_.output, "Image to write")->required();
    command->add_option("--source-dir", pack_.sourceFolder,
                        "Folder of the files, if not PACKAGE's");
    command->add_flag("--allow-unknown-macros", pack_.allowUnknownMacros,
                      "Take %...% words that are no macro as names");
    command->add_flag("--best", pack_.best, "Make the image as small as can be; takes much longer");
    command->callback([this] { PackImage(pack_); });
  }

  void AddList() {
    CLI::App* command = app_.add_subcommand("list", "Show what an image holds");
    command->add_option("IMAGE", listed_, "Image")->required();
    command->callback([this] { out_ << ListImage(listed_); });
  }

  void AddVerify() {
    CLI::App* command =
        app_.add_subcommand("verify", "Check all that the setup program takes on trust");
    command->add_option("IMAGE", verified_, "Image")->required();
    command->callback([this] { Verify(); });
  }

  void AddExtract() {
    CLI::App* command = app_.add_subcommand("extract", "Expand the files of an image");
    command->add_option("IMAGE", extract_.image, "Image")->required();
    command->add_option("NAME", extract_.names, "Files to expand, if not all");
    command->add_option("-o,--output", extract_.folder, "Folder to write to")->required();
    command->add_flag("--force", extract_.replaceExisting, "Replace files that exist");
    command->callback([this] {
      for (const auto& path : ExtractImage(extract_)) out_ << path.string() << '\n';
    });
  }

  void AddRemoval() {
    CLI::App* command =
        app_.add_subcommand("removal", "Make the removal program that an install would write");
    command->add_option("IMAGE", removal_.image, "Setup image")->required();
    command->add_option("-o,--output", removal_.output, "Removal program to write")->required();
    command->add_option("--language", removal_.language,
                        std::string(kLanguageNames) + ", or a number");
    command->callback([this] { WriteRemoval(); });
  }

  void AddExplain() {
    CLI::App* command = app_.add_subcommand("explain", "Say how a run ended, and what to do");
    command->add_option("CODE|LOG", ended_, "Exit code, signed, unsigned or 0x..., or a log file")
        ->required();
    command->callback([this] {
      const std::optional<StatusCode> code = ParseExitCode(ended_);
      out_ << (code ? ExplainExitCode(*code) : ExplainLog(ended_));
    });
  }

  void Verify() {
    for (const Finding& finding : VerifyImage(verified_)) {
      out_ << (finding.isGood ? "ok     " : "wrong  ") << finding.text << '\n';
      if (!finding.isGood) status_ = kFoundWrong;
    }
  }

  void WriteRemoval() {
    std::optional<int32_t> language;
    if (!removal_.language.empty()) {
      language = FindLanguage(removal_.language);
      if (!language) {
        throw CLI::ValidationError("--language", std::string("is to be ") + kLanguageNames);
      }
    }
    WriteRemovalImage(removal_.image, removal_.output, language);
  }

  std::ostream& out_;
  CLI::App app_{"Makes, shows, checks and unpacks setup images, and explains how runs ended.",
                "moriv-image"};
  PackOrder pack_;
  std::string listed_;
  std::string verified_;
  ExtractOrder extract_;
  RemovalOrder removal_;
  std::string ended_;
  int status_ = 0;
};

}  // namespace

int RunImageTool(int argc, const char* const* argv, std::ostream& out, std::ostream& err) {
  return ImageTool(out).Run(argc, argv, err);
}

}  // namespace image

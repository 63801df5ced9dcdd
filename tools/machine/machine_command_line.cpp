#include "tools/machine/machine_command_line.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>
#include <fstream>
#include <ostream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "machine/code_page.h"
#include "machine/drives.h"
#include "machine/host_file.h"
#include "machine/machine.h"
#include "tools/machine/drive_tree.h"
#include "tools/terminal/printable_text.h"

namespace machine_tool {
namespace {

namespace fs = std::filesystem;

constexpr int kBadInput = 2;
constexpr char kLogName[] = "MorivLog.txt";

// A machine that runs, with nothing made for it, as long as the object lives.
class RunningMachine {
 public:
  explicit RunningMachine(const fs::path& folder) {
    std::string error;
    if (!machine::StartAsItIs(folder, &error)) throw std::runtime_error(error);
  }
  ~RunningMachine() { machine::Stop(); }
  RunningMachine(const RunningMachine&) = delete;
  RunningMachine& operator=(const RunningMachine&) = delete;
};

// A folder that has no part of a machine is taken for a slip of the pen.
void RequireMachine(const fs::path& folder) {
  if (fs::is_directory(folder / "drive_c") || fs::exists(folder / "registry.reg") ||
      fs::exists(folder / "machine.ini")) {
    return;
  }
  throw std::runtime_error(folder.string() + ": is no machine; make one with moriv-machine new");
}

// Code page bytes with CR LF, for the terminal.
std::string ToHostText(const std::string& ansi) {
  std::string text = machine::ToUtf8(ansi);
  text.erase(std::remove(text.begin(), text.end(), '\r'), text.end());
  return terminal::PrintableLines(text);
}

std::string ReadText(const fs::path& path) {
  std::ifstream file(path, std::ios::binary);
  if (!file) throw std::runtime_error(path.string() + ": can't be read");
  std::ostringstream text;
  text << file.rdbuf();
  return ToHostText(text.str());
}

std::string ShowRegistry() {
  const fs::path path = machine::Folder() / "registry.reg";
  return fs::exists(path) ? ReadText(path) : "no registry.reg\n";
}

std::string ShowLog() {
  const std::string path = machine::CurrentSettings().windowsDirectory + '\\' + kLogName;
  const auto file = machine::LocateFile(path);
  return file ? ReadText(*file) : "no " + path + '\n';
}

std::string MachineIni(const std::string& platform, const std::string& language) {
  return "; Settings of this stand-in machine. All are optional.\n"
         "\n"
         "[system]\n"
         "; nt or 9x\n"
         "platform = " +
         platform +
         "\n"
         "; the system's language identifier\n"
         "language = " +
         language +
         "\n"
         "; codepage = 1252\n"
         "; windows = C:\\windows\n"
         "; system = C:\\windows\\system32\n"
         "; the time; without it, the real local time\n"
         "; now = 2001-02-03T04:05:06\n"
         "\n"
         "; [disk C]\n"
         "; bytes free to the caller\n"
         "; free = 10737418240\n"
         "; bytes that can still be written before the disk is full\n"
         "; writable = 1000000\n"
         "; readonly = 0\n"
         "\n"
         "; [api]\n"
         "; GetDiskFreeSpaceExA = absent\n"
         "\n"
         "; [faults]\n"
         "; the third call fails with error 5; \"3 on\": and all later ones\n"
         "; fail = WriteFile 3 5\n"
         "; the process ends at this call, as if the power went\n"
         "; stop = WriteFile 7\n";
}

class MachineTool {
 public:
  explicit MachineTool(std::ostream& out) : out_(out) {
    app_.require_subcommand(1);
    AddNew();
    AddShow();
    AddRestart();
  }

  int Run(int argc, const char* const* argv, std::ostream& err) {
    try {
      app_.parse(argc, argv);
      out_.flush();
      if (!out_) throw std::runtime_error("the output can't be written");
      return 0;
    } catch (const CLI::CallForHelp& help) {
      return app_.exit(help, out_, err);
    } catch (const CLI::CallForAllHelp& help) {
      return app_.exit(help, out_, err);
    } catch (const CLI::ParseError& error) {
      Tell(err, std::string(error.what()) + "; see moriv-machine --help");
    } catch (const std::exception& error) {
      Tell(err, error.what());
    }
    return kBadInput;
  }

 private:
  static void Tell(std::ostream& err, const std::string& text) {
    err << "moriv-machine: " << terminal::Printable(text) << '\n';
  }

  CLI::App* AddCommand(const char* name, const char* text) {
    CLI::App* command = app_.add_subcommand(name, text);
    command->add_option("DIR", folder_, "Folder of the machine")->required();
    return command;
  }

  void AddNew() {
    CLI::App* command = AddCommand("new", "Make a fresh machine");
    command->add_option("--platform", platform_, "nt (default) or 9x")
        ->check(CLI::IsMember({"nt", "9x"}));
    command
        ->add_option("--language", language_, "Language identifier of the system, default 0x0409")
        ->check(CLI::Range(0, 0xFFFF));
    command->callback([this] { MakeMachine(); });
  }

  void AddShow() {
    CLI::App* command = AddCommand("show", "Show drives, registry and log");
    command->add_option("PART", parts_, "tree, registry, log; all if none is named")
        ->check(CLI::IsMember({"tree", "registry", "log"}));
    command->callback([this] { Show(); });
  }

  void AddRestart() {
    CLI::App* command = AddCommand("restart", "Do what the system does at its next start");
    command->callback([this] {
      RequireMachine(folder_);
      const RunningMachine running(folder_);
      out_ << ToHostText(machine::Restart());
    });
  }

  void MakeMachine() {
    if (fs::exists(folder_) && !fs::is_empty(folder_)) {
      throw std::runtime_error(folder_ + ": has something in it; name a new folder");
    }
    std::string error;
    if (!machine::MakeFresh(folder_, &error)) throw std::runtime_error(error);
    const fs::path ini = fs::path(folder_) / "machine.ini";
    if (!machine::ReplaceHostFile(ini, MachineIni(platform_, std::to_string(language_)))) {
      throw std::runtime_error(ini.string() + ": can't be written");
    }
    const RunningMachine proof(folder_);
  }

  void Show() {
    RequireMachine(folder_);
    const RunningMachine running(folder_);
    if (parts_.empty()) parts_ = {"tree", "registry", "log"};
    for (const std::string& part : parts_) {
      if (parts_.size() > 1) out_ << "== " << part << " ==\n";
      if (part == "tree") out_ << ShowDrives(folder_);
      if (part == "registry") out_ << ShowRegistry();
      if (part == "log") out_ << ShowLog();
    }
  }

  std::ostream& out_;
  CLI::App app_{"Makes, shows and restarts stand-in machines.", "moriv-machine"};
  std::string folder_;
  std::string platform_ = "nt";
  int language_ = 0x0409;
  std::vector<std::string> parts_;
};

}  // namespace

int RunMachineTool(int argc, const char* const* argv, std::ostream& out, std::ostream& err) {
  return MachineTool(out).Run(argc, argv, err);
}

}  // namespace machine_tool

// What the system does at its next start: the commands of the RunOnce key, of which only that of
// the INF installer is understood.
//
//   DIRECTORY\rundll32.exe setupapi.dll,InstallHinfSection SECTION MODE FILE    (NT family)
//   DIRECTORY\rundll.exe setupx.dll,InstallHinfSection SECTION MODE FILE        (9x family)
//
// The directory may hold blanks, and so may the file, which goes to the end of the command. Of the
// INF file the section's DelFiles lists are processed, for lists whose DestinationDirs is 10, the
// Windows directory.
#include <algorithm>
#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "machine/code_page.h"
#include "machine/drives.h"
#include "machine/host_file.h"
#include "machine/machine.h"
#include "machine/registry_store.h"

namespace machine {
namespace {

constexpr char kRunOncePath[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\RunOnce";
constexpr char kWindowsDirectoryNumber[] = "10";

struct InstallerCommand {
  std::string section;
  std::string file;
};

std::string Trim(std::string_view text) {
  const size_t first = text.find_first_not_of(" \t\r\n");
  if (first == std::string_view::npos) return {};
  return std::string(text.substr(first, text.find_last_not_of(" \t\r\n") - first + 1));
}

std::string Unquote(const std::string& text) {
  const bool quoted = text.size() >= 2 && text.front() == '"' && text.back() == '"';
  return quoted ? text.substr(1, text.size() - 2) : text;
}

std::vector<std::string> SplitList(std::string_view text, char separator) {
  std::vector<std::string> items;
  while (!text.empty()) {
    const size_t end = std::min(text.find(separator), text.size());
    items.push_back(Trim(text.substr(0, end)));
    text.remove_prefix(std::min(end + 1, text.size()));
  }
  return items;
}

// ---- The command

// Takes a word and the blank behind it off the front; empty when there is none.
std::string TakeWord(std::string_view* text) {
  const size_t end = std::min(text->find(' '), text->size());
  std::string word(text->substr(0, end));
  text->remove_prefix(std::min(end + 1, text->size()));
  return word;
}

// Where the first `part` of the text stands, without regard to case.
size_t FindNoCase(std::string_view text, std::string_view part) {
  for (size_t at = 0; at + part.size() <= text.size(); ++at) {
    if (EqualNoCase(text.substr(at, part.size()), part)) return at;
  }
  return std::string_view::npos;
}

// Takes the command up to the installer's entry point off the front.
bool TakeProgram(std::string_view program, std::string_view* command) {
  const size_t at = FindNoCase(*command, program);
  if (at == std::string_view::npos || (at > 0 && (*command)[at - 1] != '\\')) return false;
  command->remove_prefix(at + program.size());
  return true;
}

std::optional<InstallerCommand> ParseCommand(std::string_view command) {
  if (!TakeProgram("rundll32.exe setupapi.dll,InstallHinfSection ", &command) &&
      !TakeProgram("rundll.exe setupx.dll,InstallHinfSection ", &command)) {
    return std::nullopt;
  }
  InstallerCommand parsed;
  parsed.section = TakeWord(&command);
  const std::string mode = TakeWord(&command);
  parsed.file = Trim(command);
  const bool isNumber = !mode.empty() && mode.find_first_not_of("0123456789") == std::string::npos;
  if (parsed.section.empty() || !isNumber || parsed.file.empty()) return std::nullopt;
  return parsed;
}

// ---- The INF file

struct NoCaseLess {
  bool operator()(const std::string& a, const std::string& b) const {
    return std::lexicographical_compare(a.begin(), a.end(), b.begin(), b.end(), [](char x, char y) {
      return ToUpperByte(static_cast<unsigned char>(x)) <
             ToUpperByte(static_cast<unsigned char>(y));
    });
  }
};

using InfLines = std::vector<std::string>;

class InfFile {
 public:
  explicit InfFile(std::string_view text) {
    InfLines* section = nullptr;
    for (const std::string& rawLine : SplitList(text, '\n')) {
      const std::string line = Trim(rawLine.substr(0, rawLine.find(';')));
      if (line.empty()) continue;
      if (line.front() == '[' && line.back() == ']') {
        section = &sections_[Trim(line.substr(1, line.size() - 2))];
      } else if (section != nullptr) {
        section->push_back(line);
      }
    }
  }

  // The installer takes a file for its own by this signature.
  bool IsSigned() const {
    const std::string signature = Unquote(Value("Version", "Signature"));
    return EqualNoCase(signature, "$Chicago$") || EqualNoCase(signature, "$Windows NT$");
  }

  bool HasSection(const std::string& name) const { return sections_.contains(name); }

  const InfLines& Lines(const std::string& section) const {
    static const InfLines kNone;
    const auto found = sections_.find(section);
    return found == sections_.end() ? kNone : found->second;
  }

  // What stands behind "KEY =" in the section, "" when there is no such line.
  std::string Value(const std::string& section, std::string_view key) const {
    for (const std::string& line : Lines(section)) {
      const size_t equals = line.find('=');
      if (equals == std::string::npos) continue;
      if (EqualNoCase(Trim(line.substr(0, equals)), key)) return Trim(line.substr(equals + 1));
    }
    return {};
  }

 private:
  std::map<std::string, InfLines, NoCaseLess> sections_;
};

// ---- The work

class Restarter {
 public:
  std::string Run() {
    const std::shared_ptr<RegistryKey> key = FindKey(LocalMachine(), kRunOncePath);
    while (key != nullptr && !key->values.empty()) {
      // A value is taken away first: a command that fails is not run again.
      const RegistryValue value = key->values.front();
      key->values.erase(key->values.begin());
      SaveRegistry();
      RunValue(value);
    }
    return report_;
  }

 private:
  void RunValue(const RegistryValue& value) {
    const std::string text(value.data.begin(),
                           std::find(value.data.begin(), value.data.end(), uint8_t{0}));
    Say("run " + value.name + ": " + text);
    const std::optional<InstallerCommand> command = ParseCommand(text);
    if (value.type != REG_SZ || !command) return Say("  not understood");
    ProcessInf(*command);
  }

  void ProcessInf(const InstallerCommand& command) {
    const auto file = LocateFile(command.file);
    const auto bytes = file ? ReadHostFile(*file) : std::nullopt;
    if (!bytes) return Say("  " + command.file + " can't be read");
    const InfFile inf(std::string(bytes->begin(), bytes->end()));
    if (!inf.IsSigned()) return Say("  " + command.file + " is no INF file");
    if (!inf.HasSection(command.section)) {
      return Say("  " + command.file + " has no section " + command.section);
    }
    for (const std::string& list : SplitList(inf.Value(command.section, "DelFiles"), ',')) {
      DeleteFiles(inf, list);
    }
  }

  void DeleteFiles(const InfFile& inf, const std::string& list) {
    std::string directory = inf.Value("DestinationDirs", list);
    if (directory.empty()) directory = inf.Value("DestinationDirs", "DefaultDestDir");
    if (directory != kWindowsDirectoryNumber) {
      return Say("  " + list + ": the directory " + directory + " is not understood");
    }
    for (const std::string& line : inf.Lines(list)) {
      const std::string name = Unquote(Trim(line.substr(0, line.find(','))));
      DeleteOne(CurrentSettings().windowsDirectory + '\\' + name);
    }
  }

  // The installer deletes a read-only file too.
  void DeleteOne(const std::string& path) {
    const auto file = LocateFile(path);
    if (!file) return Say("  " + path + " is not there");
    std::error_code code;
    std::filesystem::remove(*file, code);
    Say((code ? "  can't delete " : "  delete ") + path);
  }

  void Say(const std::string& line) { report_ += ToUtf8(line) + '\n'; }

  std::string report_;
};

}  // namespace

std::string Restart() {
  return Restarter().Run();
}

}  // namespace machine

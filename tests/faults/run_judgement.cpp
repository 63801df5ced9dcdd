#include "tests/faults/run_judgement.h"

#include <algorithm>
#include <optional>
#include <regex>
#include <set>

#include "tests/support/documented_codes.h"
#include "tools/image/input_file.h"
#include "tools/image/run_explainer.h"

namespace {

using Complaints = std::vector<std::string>;

using Names = std::set<std::string>;

// ---- Exit code and log

bool IsKnownEnd(const RunKind& kind, StatusCode code) {
  if (kind.IsDialog())
    return code == StatusOk || code == StatusCancelled || code == StatusDialogAborted;
  if (kind.work == kHelp) return code == 0;
  return IsSilentEnd(code, kind.work == kInstall ? "Install" : "Removal");
}

// A log that has no name, no memory or no directory or can't be made in either way is left out, and
// so is that of a dialog that was cancelled or never made.
bool CanLackLog(const FaultyRun& run) {
  static const Names reasons = {kAllocation, "LoadStringA", "GetWindowsDirectoryA", "_creat",
                                "DialogBoxParamA"};
  return run.report.code == StatusCancelled || reasons.contains(run.injection.function);
}

// Of each event of a log of one block whether it is fatal; nullopt when a byte is out of form.
std::optional<std::vector<bool>> ReadEvents(const std::string& log) {
  static const std::regex heading("\r\n\r\nInstalling Moriv : [^\r\n]* \r\n\r\n");
  static const std::regex event(
      "([0-9]+)- (?:(Fatal Error : )[^\r\n]*\\. \r\n\r\n \\(Application will exit\\)|"
      "(?!Fatal Error : )[^\r\n]*)\r\n");
  const auto whole = std::regex_constants::match_continuous;
  std::smatch match;
  if (!std::regex_search(log, match, heading, whole)) return std::nullopt;
  std::vector<bool> events;
  for (auto at = match.suffix().first; at != log.end(); at = match.suffix().first) {
    if (!std::regex_search(at, log.end(), match, event, whole)) return std::nullopt;
    events.push_back(match[2].matched);
    if (match[1] != std::to_string(events.size())) return std::nullopt;
  }
  return events;
}

bool HasRightEvents(const FaultyRun& run, const char* path, const std::vector<bool>& events) {
  // An event that finds no memory is lost, and nothing else.
  if (run.injection.function == kAllocation) return true;
  const auto fatal = std::ranges::count(events, true);
  if (run.kind.IsDialog()) {
    // A seek that fails in the check for older files closes the package without an event, and the
    // pass that finds it closed adds none. Nor does a pass that the user stops between two records.
    if (fatal == 0 && Names{"SetFilePointer", kCancel}.contains(run.injection.function))
      return true;
    return fatal == (run.report.code == StatusDialogAborted ? 1 : 0);
  }
  // A silent run gives up at its fatal event, and a reader of the log is told the exit code.
  if (EndedWell(run.report.code) ? fatal != 0 : fatal != 1 || !events.back()) return false;
  const std::string told = "exit code   " + std::to_string(run.report.code) + " ";
  if (run.report.code == StatusOk || run.report.code == 0) return true;
  const std::vector<uint8_t> log = image::ReadWholeFile(run.folder / path, UINT32_MAX);
  return image::Describe(image::ExplainLog(log)).find(told) != std::string::npos;
}

void JudgeLog(const FaultyRun& run, const char* path, Complaints* complaints) {
  // Nothing is done about a log that can't be written as it should.
  if (!run.whole.files.contains(path) || run.report.struckLog) return;
  const auto log = run.after.files.find(path);
  if (log == run.after.files.end()) {
    if (!CanLackLog(run)) complaints->push_back(std::string("missing: ") + path);
    return;
  }
  const auto events = ReadEvents(log->second);
  if (!events || !HasRightEvents(run, path, *events))
    complaints->push_back(std::string("not as it should be: ") + path + log->second);
}

// ---- The machine

constexpr char kScript[] = "drive_c/windows/Moriv.INF";
constexpr char kServices[] = "registry [HKEY_LOCAL_MACHINE\\SOFTWARE\\Zeb\\Moriv\\Services]";
constexpr char kDisplayName[] =
    "registry [HKEY_LOCAL_MACHINE\\SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\Uninstall\\Moriv] "
    "\"DisplayName\"";
constexpr char kRunOnce[] =
    "registry [HKEY_LOCAL_MACHINE\\SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\RunOnce] "
    "\"MorivCommand\"";

bool Holds(const MachineState& state, const std::string& name, const std::string& content) {
  const auto item = state.items.find(name);
  return item != state.items.end() && item->second == content;
}

// What may stand there besides the old and the whole content. Without power nobody cleans up, and
// of a file that was being written there is a beginning; a script that could not be written whole
// stays too, without the command that would use it. A system that doesn't tell its family gets the
// 9x family's command, and a name that the catalog doesn't give is an empty one.
bool MayStand(const FaultyRun& run, const std::string& name, const std::string& content) {
  const auto whole = run.whole.items.find(name);
  if (whole == run.whole.items.end()) return false;
  const bool isFile = run.whole.files.contains(name) && whole->second != kFolder;
  if (isFile && (run.report.end == RunEnd::kStopped || name == kScript))
    return whole->second.starts_with(content);
  if (name == kRunOnce && run.injection.function == "GetVersionExA")
    return content.find("\\rundll.exe setupx.dll,") != std::string::npos;
  return name == kDisplayName && run.injection.function == "LoadStringA" && content == "=\"\"";
}

void JudgeMachine(const FaultyRun& run, Complaints* complaints) {
  for (const auto& [name, content] : run.after.items) {
    if (!Holds(run.before, name, content) && !Holds(run.whole, name, content) &&
        !MayStand(run, name, content))
      complaints->push_back("neither old nor whole: " + name);
  }
  for (const auto& [name, content] : run.before.items) {
    if (Holds(run.whole, name, content) && !run.after.items.contains(name))
      complaints->push_back("gone: " + name);
  }
  if (run.after.items.contains(kRunOnce) && !run.before.items.contains(kRunOnce) &&
      !Holds(run.after, kScript, run.whole.items.at(kScript)))
    complaints->emplace_back("a command without its whole script");
}

// ---- The second run

// The folder, or one in it, holds no file.
bool HoldsEmptyFolder(const MachineState& state, const std::string& folder) {
  return std::ranges::any_of(state.files, [&](const auto& inner) {
    const std::string below = inner.first + "/";
    return inner.second == kFolder && below.starts_with(folder + "/") &&
           std::ranges::none_of(state.files, [&](const auto& other) {
             return other.second != kFolder && other.first.starts_with(below);
           });
  });
}

// What a second removal can't know of. A directory is tried only after a file in it was deleted.
// And after a removal that has ended the product is no longer registered: what stayed in the
// system's directory or with a browser is out of sight.
bool IsOutOfSight(const FaultyRun& first, const std::string& name, const std::string& content) {
  if (first.kind.work != kRemoval) return false;
  if (content == kFolder) return HoldsEmptyFolder(first.after, name);
  return first.report.end == RunEnd::kReturned && EndedWell(first.report.code) &&
         Holds(first.before, name, content) &&
         (name.starts_with("drive_c/windows/system32/") || name.starts_with("drive_c/Opera/"));
}

}  // namespace

std::vector<std::string> JudgeRun(const FaultyRun& run) {
  Complaints complaints;
  if (run.report.end == RunEnd::kCrashed) complaints.emplace_back("crashed");
  if (run.report.end == RunEnd::kStuck) complaints.emplace_back("the dialog can't be closed");
  if (run.report.end == RunEnd::kReturned) {
    if (run.injection.stop) complaints.emplace_back("the power was not lost");
    const std::string open = run.report.openObjects;
    if (!open.empty()) complaints.push_back("open: " + open);
    if (run.report.leakedBlocks != 0) complaints.emplace_back("memory leaked");
    if (!IsKnownEnd(run.kind, run.report.code)) complaints.emplace_back("no exit code of this run");
    for (const char* path : {kLogPath, kReportPath}) JudgeLog(run, path, &complaints);
  }
  JudgeMachine(run, &complaints);
  return complaints;
}

std::vector<std::string> JudgeSecondRun(const FaultyRun& first, const RunReport& second,
                                        const MachineState& after) {
  Complaints complaints;
  const int goal = first.kind.work == kHelp ? 0 : StatusOk;
  if (second.end != RunEnd::kReturned || second.code != goal)
    complaints.push_back("a second run gives " + std::to_string(second.code));
  for (const auto& [name, content] : first.whole.items) {
    // The tree is made only where its root is missing, and does without this key.
    if (name == kServices && first.injection.function == "RegCreateKeyExA") continue;
    if (!Holds(after, name, content)) complaints.push_back("a second run doesn't make " + name);
  }
  for (const auto& [name, content] : after.items) {
    if (!first.whole.items.contains(name) && !IsOutOfSight(first, name, content))
      complaints.push_back("a second run leaves " + name);
  }
  return complaints;
}

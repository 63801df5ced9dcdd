#include "tools/planner/plan_report.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "platform/text.h"
#include "platform/win32.h"
#include "tools/image/language_names.h"
#include "tools/image/run_explainer.h"
#include "tools/image/run_outcomes.h"
#include "tools/terminal/printable_text.h"

namespace image {
namespace {

constexpr char kPackageFile[] = "file of the package";

constexpr const char* kChangeWords[] = {"added", "changed", "removed"};

const char* WordOf(Change change) {
  return kChangeWords[static_cast<int>(change)];
}

// Under its heading, which stands behind an empty line; "" without lines.
std::string Section(const std::string& heading, const std::string& lines) {
  return lines.empty() ? "" : '\n' + heading + '\n' + lines;
}

std::string Entry(const std::string& first, const std::string& second, const std::string& rest) {
  char line[80];
  std::snprintf(line, sizeof line, "%12s  %-26s ", first.c_str(), second.c_str());
  return line + rest + '\n';
}

std::string FreeText(const std::optional<uint64_t>& free) {
  return free ? std::to_string(*free) + " free" : "free space unknown";
}

int64_t RoomBehind(const RunPlan& plan) {
  return int64_t{kPathSize} - 1 - static_cast<int64_t>(plan.longestLength);
}

std::string ShowEnd(const RunPlan& plan) {
  const std::string event = plan.event.empty() ? "none that tells how the run ended" : plan.event;
  if (!plan.exitCode)
    return ReportLine("exit code", "none: a fault of the machine's stops the process");
  return ReportLine("event", terminal::Printable(event)) +
         Describe(ExplainExitCode(*plan.exitCode));
}

std::string ShowSettings(const RunPlan& plan) {
  std::string text =
      ReportLine("machine", plan.machine.empty() ? "a fresh one" : terminal::Quoted(plan.machine));
  text += ReportLine("run", std::string(plan.isRemoval ? "removal" : "install") + " with " +
                                terminal::Quoted(plan.arguments));
  if (!plan.directory.empty())
    text += ReportLine("directory", terminal::Quoted(plan.directory) + ", " + plan.directoryReason);
  if (plan.language)
    text += ReportLine("language", DescribeLanguage(*plan.language) + ", " + plan.languageReason);
  if (!plan.longestPath.empty()) {
    text += ReportLine("longest", std::to_string(plan.longestLength) + " characters, room for " +
                                      std::to_string(RoomBehind(plan)) + ": " +
                                      terminal::Quoted(plan.longestPath));
  }
  return text;
}

std::string ReplacedText(const PlannedPlace& place) {
  std::string text = place.replaces;
  if (!place.replacedVersion.empty()) text += ' ' + place.replacedVersion;
  return text == "nothing" ? text : text + ", " + std::to_string(place.replacedSize);
}

// "" for what the section's heading says.
const char* RemarkOn(const PlannedPlace& place, bool isRemoval) {
  const bool isThere = place.replaces != "nothing";
  if (!place.isChanged) return isRemoval && !isThere ? " (not there)" : " (left alone)";
  return isRemoval || place.stands ? "" : " (deleted, and not written anew)";
}

std::string ShowPlaces(const RunPlan& plan) {
  if (plan.places.empty()) return {};
  std::string text = Entry("size", plan.isRemoval ? "deletes" : "replaces", "place");
  for (const PlannedPlace& place : plan.places) {
    text += Entry(std::to_string(place.size), ReplacedText(place),
                  terminal::Quoted(place.path) + RemarkOn(place, plan.isRemoval));
  }
  return text;
}

std::string ShowDrives(const RunPlan& plan) {
  std::string text;
  for (const DriveUse& use : plan.drives) {
    std::string drive = {use.drive, ':'};
    if (use.isInstallDrive)
      drive += " where the package asks for " + std::to_string(plan.spaceNeeded);
    text += Entry(std::to_string(use.bytes), FreeText(use.free), drive);
  }
  return text;
}

std::string ShowFiles(const RunPlan& plan, bool folders) {
  std::string text;
  for (const FileSystemChange& change : plan.files) {
    if (change.path.ends_with('\\') != folders || change.role == kPackageFile) continue;
    const std::string size =
        folders || change.change == Change::kRemoved ? "" : std::to_string(change.size);
    text +=
        Entry(size, WordOf(change.change),
              terminal::Quoted(change.path) + (change.role.empty() ? "" : ", the " + change.role));
  }
  return text;
}

std::string ShowRegistry(const RunPlan& plan) {
  std::string text, lastKey;
  for (const RegistryChange& change : plan.registry) {
    if (change.key != lastKey)
      text += "  " + std::string(change.value ? "" : std::string(WordOf(change.change)) + " ") +
              terminal::Quoted(change.key) + '\n';
    lastKey = change.key;
    if (!change.value) continue;
    const std::string data = change.type == REG_SZ
                                 ? terminal::Quoted(change.text)
                                 : "type " + std::to_string(change.type) + ": " + change.data;
    text += std::string("    ") + WordOf(change.change) + ' ' + terminal::Quoted(*change.value) +
            " = " + data + '\n';
  }
  return text;
}

Json PlaceAsJson(const PlannedPlace& place) {
  return {{"record", place.record},
          {"path", place.path},
          {"size", place.size},
          {"replaces", place.replaces},
          {"replacedVersion", place.replacedVersion},
          {"replacedSize", place.replacedSize},
          {"changed", place.isChanged},
          {"stands", place.stands}};
}

Json RegistryAsJson(const RegistryChange& change) {
  Json object = {{"change", WordOf(change.change)}, {"key", change.key}};
  if (!change.value) return object;
  object["value"] = *change.value;
  object["type"] = change.type;
  object["data"] = change.data;
  if (change.type == REG_SZ) object["text"] = change.text;
  return object;
}

Json DriveAsJson(const DriveUse& use) {
  return {{"drive", std::string{use.drive, ':'}},
          {"installDrive", use.isInstallDrive},
          {"bytes", use.bytes},
          {"free", use.free ? Json(*use.free) : Json()}};
}

template <class List, class Convert>
Json ListAsJson(const List& list, const Convert& convert) {
  Json array = Json::array();
  for (const auto& element : list) array.push_back(convert(element));
  return array;
}

}  // namespace

std::string ShowPlan(const RunPlan& plan) {
  std::string log, stays, deleted;
  for (const std::string& line : plan.log) log += "  " + terminal::Printable(line) + '\n';
  for (const StayingPath& stay : plan.stays)
    stays += Entry("", stay.reason, terminal::Quoted(stay.path));
  for (const std::string& path : plan.deletedAtNextStart)
    deleted += "  " + terminal::Quoted(path) + '\n';
  return ShowSettings(plan) + ShowEnd(plan) + Section("files of the package", ShowPlaces(plan)) +
         Section("drives, in bytes", ShowDrives(plan)) +
         Section("directories", ShowFiles(plan, true)) +
         Section("other files", ShowFiles(plan, false)) + Section("registry", ShowRegistry(plan)) +
         Section("log", log) + Section("stays", stays) +
         Section("deleted at the next start of the system", deleted);
}

Json PlanAsJson(const RunPlan& plan) {
  const RunOutcome* const outcome = plan.exitCode ? FindRunOutcome(*plan.exitCode) : nullptr;
  return {
      {"image", plan.image},
      {"machine", plan.machine.empty() ? Json() : Json(plan.machine)},
      {"arguments", plan.arguments},
      {"run", plan.isRemoval ? "removal" : "install"},
      {"exitCode", plan.exitCode ? Json(*plan.exitCode) : Json()},
      {"meaning", outcome != nullptr ? outcome->meaning : ""},
      {"event", plan.event},
      {"log", plan.log},
      {"directory", plan.directory},
      {"directoryReason", plan.directoryReason},
      {"language", plan.language ? Json(*plan.language) : Json()},
      {"languageReason", plan.languageReason},
      {"spaceNeeded", plan.spaceNeeded},
      {"longestPath", plan.longestPath},
      {"longestPathRoom", RoomBehind(plan)},
      {"places", ListAsJson(plan.places, PlaceAsJson)},
      {"drives", ListAsJson(plan.drives, DriveAsJson)},
      {"files", ListAsJson(plan.files,
                           [](const FileSystemChange& change) {
                             return Json{{"change", WordOf(change.change)},
                                         {"path", change.path},
                                         {"size", change.size},
                                         {"role", change.role}};
                           })},
      {"registry", ListAsJson(plan.registry, RegistryAsJson)},
      {"stays", ListAsJson(plan.stays,
                           [](const StayingPath& stay) {
                             return Json{{"path", stay.path}, {"reason", stay.reason}};
                           })},
      {"deletedAtNextStart", plan.deletedAtNextStart},
  };
}

}  // namespace image

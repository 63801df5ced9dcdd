#include "tools/planner/run_planner.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <stdexcept>

#include "core/command_line.h"
#include "machine/code_page.h"
#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/machine.h"
#include "platform/entry.h"
#include "tools/image/bad_input.h"
#include "tools/image/input_file.h"
#include "tools/image/run_explainer.h"
#include "tools/planner/child_process.h"
#include "tools/planner/machine_changes.h"
#include "tools/planner/machine_copy.h"
#include "tools/planner/run_survey.h"

namespace fs = std::filesystem;

namespace image {
namespace {

constexpr int kStoppedStatus = 4;  // of a process that a fault of the machine's has stopped
constexpr uint64_t kLargestLog = 64 << 20;  // bytes

void StartMachine(const fs::path& folder, const fs::path& image, const std::string& arguments) {
  std::string error;
  if (!machine::Start(folder, image, &error)) throw std::runtime_error(error);
  machine::CurrentSettings().commandLine =
      '"' + machine::ImagePath() + "\" " + machine::FromUtf8(arguments);
}

// The program, as its native entry runs it. It waits to be asked with its arguments.
ChildProcess::Work ProgramRun(const fs::path& folder, const fs::path& image) {
  return [folder, image](const std::string& arguments, std::string* exitCode) {
    const int nowhere = open("/dev/null", O_WRONLY | O_CLOEXEC);
    for (const int shown : {STDOUT_FILENO, STDERR_FILENO}) dup2(nowhere, shown);
    StartMachine(folder, image, arguments);
    *exitCode = std::to_string(RunProgram());
    return 0;
  };
}

std::optional<StatusCode> ExitCodeOf(const ChildAnswer& answer) {
  if (answer.status == kStoppedStatus) return std::nullopt;
  if (answer.status != 0)
    throw std::runtime_error("the setup program ended without an exit code " + answer.output);
  return std::stoi(answer.output);
}

SetupRequest RequestOf(const std::string& arguments) {
  SetupRequest request = {};
  (void)ParseCommandLine(machine::FromUtf8(arguments).c_str(), &request);
  return request;
}

bool IsSilent(const SetupRequest& request) {
  return (request.options & OptionSilent) != 0;
}

// The program splits its line at the next "/" wherever it stands, and at "-" where none is left, so
// that what is put together here need not be what it understands.
std::string ArgumentsOf(const PlanOrder& order) {
  std::string arguments = order.directory.empty() ? "" : "/d:" + order.directory;
  for (const std::string& more : {std::string(order.remove ? "/u" : ""), order.options})
    if (!more.empty()) arguments += (arguments.empty() ? "" : " ") + more;
  if (!IsSilent(RequestOf(arguments))) arguments += arguments.empty() ? "/s" : " /s";

  const SetupRequest request = RequestOf(arguments);
  const bool isUnderstood =
      IsSilent(request) && (!order.remove || (request.options & OptionRemove) != 0) &&
      (order.directory.empty() || machine::FromUtf8(order.directory) == request.installDir);
  if (!isUnderstood)
    throw std::runtime_error("the setup program takes \"" + arguments +
                             "\" for something else; see how it splits its command line");
  return arguments;
}

// A folder without anything of a machine in it would be made one by its first run.
void RequireMachine(const fs::path& folder) {
  if (fs::is_directory(folder / "drive_c") || fs::exists(folder / "registry.reg") ||
      fs::exists(folder / "machine.ini")) {
    return;
  }
  throw BadInput(folder, "is no machine; make one with moriv-machine new");
}

class RunPlanner {
 public:
  explicit RunPlanner(const PlanOrder& order, const fs::path& folder)
      : order_(order), folder_(folder / "machine"), image_(fs::canonical(order.image)) {
    if (!order.machine) return;
    RequireMachine(*order.machine);
    CopyMachine(*order.machine, folder_);
    image_ = PathInCopy(image_, *order.machine, folder_);
  }

  RunPlan Plan() {
    plan_.image = TextOf(order_.image);
    if (order_.machine) plan_.machine = TextOf(*order_.machine);
    // Made before a function of the program has run here: it keeps what the system answers.
    ChildProcess run(ProgramRun(folder_, image_));

    StartOnCopy();
    plan_.arguments = ArgumentsOf(order_);
    machine::CurrentSettings().commandLine += machine::FromUtf8(plan_.arguments);
    AgeMachineFiles();
    const MachineContents before = ReadMachineContents();
    survey_ = SurveyRun(&plan_);
    machine::Stop();

    plan_.exitCode = ExitCodeOf(run.Ask(plan_.arguments));

    StartOnCopy();
    const MachineContents after = ReadMachineContents();
    plan_.files = CompareFiles(before, after);
    plan_.registry = CompareRegistry(before, after);
    FollowPlaces();
    NameFiles();
    AddUpDrives();
    if (plan_.isRemoval) {
      FindDeletedAtNextStart(after);
      FindWhatStays(after);
    }
    machine::Stop();
    return std::move(plan_);
  }

 private:
  // The machine's faults strike the run alone.
  void StartOnCopy() {
    try {
      StartMachine(folder_, image_, "");
    } catch (const std::runtime_error& error) {
      // Tell it of the machine that was given.
      std::string text = error.what();
      const size_t place = text.find(folder_.string());
      if (order_.machine && place != std::string::npos)
        text.replace(place, folder_.string().size(), TextOf(*order_.machine));
      throw std::runtime_error(text);
    }
    machine::SetFaults({});
  }

  // The path of what stands there, or would stand there, as the machine spells it.
  static std::string Spelled(const std::string& path) {
    const auto location = machine::Locate(path);
    return location ? DosPathOf(location->host) : "";
  }

  // 0 for a path that leads nowhere.
  static char DriveOf(const std::string& path) {
    const auto location = machine::Locate(path);
    return location ? location->drive : '\0';
  }

  FileSystemChange* FindChange(const std::string& path) {
    const auto found = std::ranges::lower_bound(plan_.files, path, {}, &FileSystemChange::path);
    return found == plan_.files.end() || found->path != path ? nullptr : &*found;
  }

  void FollowPlaces() {
    for (size_t i = 0; i < plan_.places.size(); ++i) {
      PlannedPlace& place = plan_.places[i];
      const std::string path = Spelled(survey_.placePaths[i]);
      FileSystemChange* const change = FindChange(path);
      place.isChanged = change != nullptr;
      place.stands = machine::LocateFile(survey_.placePaths[i]).has_value();
      if (change != nullptr) change->role = "file of the package";
    }
  }

  void NameFiles() {
    if (FileSystemChange* const program = FindChange(Spelled(survey_.removalProgram)))
      program->role = "removal program";
    const std::string log = Spelled(survey_.log);
    FileSystemChange* const change = FindChange(log);
    if (change == nullptr) return;
    change->role = "log";
    const auto file = machine::LocateFile(survey_.log);
    if (!file) return;
    const std::vector<uint8_t> text = ReadWholeFile(*file, kLargestLog);
    plan_.log = ReadEventLines(text);
    if (plan_.exitCode) plan_.event = DecidingEvent(text, *plan_.exitCode);
  }

  void AddUpDrives() {
    std::map<char, uint64_t> bytes;
    char installDrive = 0;
    if (!plan_.isRemoval) {
      for (size_t i = 0; i < plan_.places.size(); ++i)
        bytes[DriveOf(survey_.placePaths[i])] += plan_.places[i].size;
      installDrive = DriveOf(machine::FromUtf8(plan_.directory));
      bytes[installDrive] += 0;
    }
    bytes.erase(0);
    for (const FileSystemChange& change : plan_.files)
      if (change.role != "file of the package" && change.change != Change::kRemoved)
        bytes[change.path.front()] += change.size;
    for (const auto& [drive, sum] : bytes) {
      DriveUse use = {.drive = drive, .isInstallDrive = drive == installDrive, .bytes = sum};
      const auto free = survey_.freeBytes.find(drive);
      if (free != survey_.freeBytes.end()) use.free = free->second;
      plan_.drives.push_back(use);
    }
  }

  void FindDeletedAtNextStart(const MachineContents& after) {
    (void)machine::Restart();
    for (const FileSystemChange& change : CompareFiles(after, ReadMachineContents()))
      if (change.change == Change::kRemoved) plan_.deletedAtNextStart.push_back(change.path);
  }

  // Files of the package that stand, directories that the removal tries and that are not empty, and
  // what they hold.
  void FindWhatStays(const MachineContents& after) {
    std::map<std::string, std::string> reasons;
    for (const std::string& directory : survey_.directories) {
      const std::string path = Spelled(directory) + '\\';
      if (!after.files.contains(path)) continue;
      reasons[path] = "not empty";
      for (const auto& [inside, facts] : after.files)
        if (inside.starts_with(path) && inside != path)
          reasons.try_emplace(
              inside, facts.isFolder ? "the removal doesn't try it" : "no file of the package");
    }
    const bool isDone = plan_.exitCode == StatusOk;
    for (size_t i = 0; i < plan_.places.size(); ++i)
      if (plan_.places[i].stands)
        reasons[Spelled(survey_.placePaths[i])] =
            isDone ? "in use or read-only" : "the removal ends before it";
    for (const auto& [path, reason] : reasons) plan_.stays.push_back({path, reason});
  }

  const PlanOrder& order_;
  fs::path folder_;  // of the copy
  fs::path image_;   // canonical; in the copy, if it lies in the machine
  RunPlan plan_;
  RunSurvey survey_;
};

}  // namespace

RunPlan PlanRun(const PlanOrder& order, const fs::path& folder) {
  const InputFile readable(order.image);
  return RunPlanner(order, folder).Plan();
}

}  // namespace image

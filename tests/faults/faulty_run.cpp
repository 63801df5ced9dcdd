#include "tests/faults/faulty_run.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <new>

#include "core/command_line.h"
#include "core/driver.h"
#include "machine/faults.h"
#include "machine/machine.h"
#include "machine/scripted_user.h"
#include "machine/windows.h"
#include "tests/support/allocation_faults.h"
#include "ui/control_ids.h"

namespace fs = std::filesystem;

namespace {

constexpr int kStopStatus = 4;
constexpr unsigned kLongestRun = 10;  // seconds

bool Press(int id) {
  const machine::Window* const control = machine::OpenDialog()->Find(id);
  if (control == nullptr || !control->IsShown() || !control->IsEnabled()) return false;
  machine::Click(control->handle);
  return true;
}

// Wants the work done and then the dialog closed: presses the end button of an end page, else the
// button that starts the work, and cancels when that has come to nothing three times.
auto DecidedUser(const std::vector<int>& workButtons, RunReport* report) {
  return [workButtons, report, turns = 0, tries = 0]() mutable {
    if (++turns > 12) {
      report->end = RunEnd::kStuck;
      _exit(EXIT_SUCCESS);
    }
    if (Press(IDOK) || Press(IDC_FAILURE_END)) return;
    if (tries < 3 && std::ranges::any_of(workButtons, Press))
      ++tries;
    else
      machine::SendCancel();
  };
}

void InjectFault(const RunKind& kind, const Injection& injection, const fs::path& folder,
                 RunReport* report) {
  const auto observer = [folder, report] {
    ++report->strikes;
    report->struckLog |= fs::exists(folder / kLogPath) || fs::exists(folder / kReportPath);
  };
  const auto functionObserver = [observer, name = injection.function](const machine::Fault& fault) {
    if (fault.function == name || name == kCancel) observer();
    if (name == kCancel) machine::PostCancel();  // the next poll meets it
  };
  std::vector<machine::Fault> faults = kind.always;
  if (injection.function == kAllocation) {
    FailAllocation(injection.call, injection.fromThenOn, observer);
  } else if (injection.function == kCancel) {
    faults.push_back({.function = "PeekMessageA", .call = injection.call});
  } else if (!injection.function.empty()) {
    faults.push_back(injection);
  }
  machine::SetFaults(faults, functionObserver);
}

[[noreturn]] void RunProgram(const RunKind& kind, const Injection& injection,
                             const fs::path& folder, RunReport* report) {
  dup2(open("/dev/null", O_WRONLY | O_CLOEXEC), STDOUT_FILENO);  // what the user sees
  alarm(kLongestRun);
  std::string error;
  if (!machine::Start(folder, folder / kind.image, &error)) {
    std::fprintf(stderr, "%s\n", error.c_str());
    _exit(EXIT_FAILURE);
  }
  if (kind.IsDialog()) machine::SetUser(DecidedUser(kind.workButtons, report));

  SetupRequest request = {};
  request.language = kLanguageNone;
  if (ParseCommandLine(kind.commandLine.c_str(), &request) == 0) request.options = kDefaultOptions;
  const int liveBefore = LiveAllocations();
  InjectFault(kind, injection, folder, report);
  report->code = RunSetup(request);
  (void)WithdrawAllocationFailure();
  report->leakedBlocks = LiveAllocations() - liveBefore;
  (void)machine::Stop().copy(report->openObjects, sizeof(report->openObjects) - 1);
  report->end = RunEnd::kReturned;
  _exit(EXIT_SUCCESS);
}

}  // namespace

// Asked by AddressSanitizer at its start. It keeps the freed blocks of a run, but not those of all
// runs before: each run is a fork, which would have to copy the tables of all that memory.
extern "C" const char* __asan_default_options();
extern "C" const char* __asan_default_options() {
  return "quarantine_size_mb=8";
}

RunReport RunWithFault(const RunKind& kind, const Injection& injection, const fs::path& folder) {
  // In memory that this process and the one that it makes both see.
  static void* const memory =
      mmap(nullptr, sizeof(RunReport), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
  auto* const report = new (memory) RunReport();
  const pid_t child = fork();
  if (child == 0) RunProgram(kind, injection, folder, report);
  int status = 0;
  if (child < 0 || waitpid(child, &status, 0) != child) return {};
  RunReport result = *report;
  if (WIFEXITED(status) && WEXITSTATUS(status) == kStopStatus)
    result.end = RunEnd::kStopped;
  else if (status != 0)
    result.end = RunEnd::kCrashed;
  return result;
}

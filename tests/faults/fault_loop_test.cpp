// Every fault in every kind of run: the n-th call of each function of the seam fails, falls short,
// or is where the power goes, the n-th allocation fails, and the user cancels at the n-th poll, for
// n = 1, 2, 3 ... until a run ends without having met the fault. After each the machine is looked
// at, and the program run once more without a fault.
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <iostream>
#include <map>
#include <set>

#include "core/status.h"
#include "machine/seam_functions.h"
#include "tests/faults/faulty_run.h"
#include "tests/faults/run_judgement.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"
#include "ui/control_ids.h"

namespace {

namespace fs = std::filesystem;

constexpr int kMostComplaints = 40;  // of one kind of run; they tend to be the same

constexpr char kOldVersion[] = "4.1.6";
constexpr char kNewVersion[] = "4.1.7";

// The calls that change something: a power loss at any other call is one at the next of these.
constexpr std::string_view kChangingFunctions[] = {
    "CreateFileA",      "WriteFile",     "DeleteFileA",     "CopyFileA", "CreateDirectoryA",
    "RemoveDirectoryA", "_creat",        "_chmod",          "_write",    "RegCreateKeyExA",
    "RegSetValueExA",   "RegDeleteKeyA", "RegDeleteValueA",
};

// Targets in subdirectories, in the system's and in a browser's; a browser that is missing; streams
// of one block and of several; no two versions of a file alike.
void WriteImage(const TestMachine& pc, const std::string& version) {
  const auto seed = static_cast<unsigned>(version.back());
  ImageBuilder image(version);
  image.Add("moriv.exe", "%INSTALL_DIR%", VersionedProgram(version) + RandomBytes(1500, seed))
      .Add("moriv.dll", "%INSTALL_DIR%\\bin;%SYS_DIR%", RandomBytes(2500, seed + 1))
      .Add("plugin.dll", "%INSTALL_DIR%\\plug;%PLUGIN_ALL_DIR%", RandomBytes(200, seed + 2))
      .Add("netscape.dll", "%PLUGIN_NS_DIR%", RandomBytes(300, seed + 3))
      .Add("empty.txt", "%INSTALL_DIR%", version == kOldVersion ? "not yet" : "");
  image.header().defaultLanguage = kLanguageFrench;
  image.header().spaceNeeded = 9000;
  (void)CopyText(image.header().defaultDirectory, "C:\\Program Files\\Moriv");
  pc.Write("drive_c/setup.exe", image.Bytes());
}

// A browser to find, and what belongs to others.
void FurnishMachine(const TestMachine& pc) {
  pc.Write("drive_c/Opera/Plugins/other.dll", "other");
  pc.Write("drive_c/Program Files/other.txt", "other");
  SetRegistryText(AppPathsKey("Opera.exe"), "Path", std::string("C:\\Opera", 9));
  SetRegistryText("SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\Uninstall\\Other", "DisplayName",
                  std::string("Other", 6));
}

class FaultLoop : public testing::Test {
 protected:
  enum class Machine { kFresh, kOutdated, kUpToDate };

  // How much a loop must have tried at least, so that it can't pass by trying nothing: some less
  // than there is today.
  struct Floor {
    int faults, failures, powerLosses;
    size_t statesRunAgain;
  };

  // The whole loop of one kind of run, on a machine with no product, an older or the same one.
  void Run(const RunKind& runKind, Machine installed, const Floor& floor,
           const std::string& system = "") {
    kind = runKind;
    Prepare(installed, system);
    const RunReport report = RunFrom(before, {});
    whole = after;
    ASSERT_EQ(report.end, RunEnd::kReturned);
    ASSERT_EQ(report.code, kind.work == kHelp ? 0 : StatusOk);

    for (const std::string_view function : machine::kSeamFunctions) {
      const bool failsAnyway = std::ranges::count(kind.always, function, &machine::Fault::function);
      if (!failsAnyway) TryFunction(std::string(function));
    }
    TryCalls({.function = kAllocation});
    TryCalls({.function = kAllocation, .fromThenOn = true});
    if (kind.IsDialog()) TryCalls({.function = kCancel});
    Tell();
    EXPECT_TRUE(faults >= floor.faults && faults - endedWell >= floor.failures &&
                powerLosses >= floor.powerLosses && statesRunAgain.size() >= floor.statesRunAgain);
  }

 private:
  void Prepare(Machine installed, const std::string& system) {
    pc.Write("machine.ini", "[system]\nnow = 2001-12-31T23:59:00\n" + system);
    pc.Restart();
    FurnishMachine(pc);
    machine::Stop();
    if (installed != Machine::kFresh) {
      WriteImage(pc, installed == Machine::kOutdated ? kOldVersion : kNewVersion);
      ASSERT_EQ(RunWithFault({.commandLine = "/s /r"}, {}, folder).code, StatusOk);
      fs::remove(folder / kLogPath);
    }
    WriteImage(pc, kNewVersion);
    before = ReadMachine(folder);
  }

  RunReport RunFrom(const MachineState& state, const Injection& injection) {
    WriteMachine(folder, state);
    const RunReport report = RunWithFault(kind, injection, folder);
    after = ReadMachine(folder);
    return report;
  }

  void TryFunction(const std::string& function) {
    TryCalls({.function = function});
    // A dialog that the system never ends can't be ended.
    if (function != "EndDialog") TryCalls({.function = function, .fromThenOn = true});
    if (machine::MovesBytes(function)) {
      TryCalls({.function = function, .isShort = true});
      TryCalls({.function = function, .fromThenOn = true, .isShort = true});
    }
    if (std::ranges::count(kChangingFunctions, function) == 0) return;
    TryCalls({.function = function, .stop = true});
    if (machine::MovesBytes(function))
      TryCalls({.function = function, .isShort = true, .stop = true});
  }

  // The fault at every call, until a run ends without having met it.
  void TryCalls(Injection injection) {
    for (injection.call = 1; complaintCount < kMostComplaints; ++injection.call) {
      const RunReport report = RunFrom(before, injection);
      if (report.end == RunEnd::kReturned && report.strikes == 0) return;
      ++(injection.stop ? powerLosses : faults);
      if (!injection.stop && EndedWell(report.code)) ++endedWell;
      const MachineState left = after;
      const FaultyRun run = {kind, injection, report, before, whole, left, folder};
      Complain(run, JudgeRun(run));
      RunAgain(run);
    }
  }

  // A state is run again once, however many faults led to it.
  void RunAgain(const FaultyRun& first) {
    MachineState start = first.after;
    start.files.erase(kLogPath);
    start.files.erase(kReportPath);
    if (start.files == before.files || !statesRunAgain.insert(start.files).second) return;
    const RunReport second = RunFrom(start, {});
    Complain(first, JudgeSecondRun(first, second, after));
  }

  void Complain(const FaultyRun& run, const std::vector<std::string>& complaints) {
    const Injection& fault = run.injection;
    for (const std::string& complaint : complaints) {
      ++complaintCount;
      ADD_FAILURE() << fault.function << ' ' << fault.call << (fault.fromThenOn ? " on" : "")
                    << (fault.isShort ? " short" : "") << (fault.stop ? " stop" : "") << ", code "
                    << run.report.code << ": " << complaint;
    }
  }

  // One line, which tools/test shows at the end of all tests.
  void Tell() const {
    const std::string name = testing::UnitTest::GetInstance()->current_test_info()->name();
    std::ostringstream line;
    line << "faults: " << name << ": " << faults << " tried, " << complaintCount << " complaints; "
         << endedWell << " ended well, " << faults - endedWell << " with a failure; " << powerLosses
         << " power losses; run again from " << statesRunAgain.size() << " states\n";
    std::cout << line.str();
    fs::create_directories(MORIV_COUNTS_DIR);
    std::ofstream(fs::path(MORIV_COUNTS_DIR) / (name + ".count")) << line.str();
  }

  TestMachine pc;
  const fs::path folder = pc.Host("");
  RunKind kind;
  MachineState before;
  MachineState whole;  // what a run without a fault leaves
  MachineState after;  // what the last run has left
  std::set<std::map<std::string, std::string>> statesRunAgain;
  int faults = 0;
  int endedWell = 0;
  int powerLosses = 0;
  int complaintCount = 0;
};

constexpr char kSilentInstall[] = "/s /r /rf:C:\\report.txt";

TEST_F(FaultLoop, FreshInstall) {
  Run({.commandLine = kSilentInstall}, Machine::kFresh, {500, 190, 90, 50});
}

TEST_F(FaultLoop, Update) {
  Run({.commandLine = kSilentInstall}, Machine::kOutdated, {520, 200, 95, 40});
}

// The image is read, and all that is written goes, through the runtime's descriptors.
TEST_F(FaultLoop, UpdateByDescriptors) {
  Run({.commandLine = kSilentInstall, .always = {{.function = "CreateFileA", .fromThenOn = true}}},
      Machine::kOutdated, {560, 220, 100, 40}, "platform = 9x\n");
}

TEST_F(FaultLoop, Removal) {
  Run({.work = kRemoval, .commandLine = "/s /u /r"}, Machine::kUpToDate, {310, 75, 55, 45});
}

TEST_F(FaultLoop, RemovalProgram) {
  Run({.work = kRemoval, .commandLine = "/s /r", .image = "drive_c/windows/MorivRmv.exe"},
      Machine::kUpToDate, {310, 75, 55, 45}, "platform = 9x\n");
}

TEST_F(FaultLoop, Help) {
  Run({.work = kHelp, .commandLine = "/h /s /rf:C:\\report.txt"}, Machine::kFresh, {50, 0, 5, 0});
}

TEST_F(FaultLoop, DialogInstall) {
  Run({.workButtons = {IDC_NEXT, IDC_UPDATE}}, Machine::kFresh, {1200, 340, 70, 50});
}

TEST_F(FaultLoop, DialogUpdate) {
  Run({.workButtons = {IDC_NEXT, IDC_UPDATE}}, Machine::kOutdated, {1300, 360, 75, 40});
}

TEST_F(FaultLoop, DialogRemoval) {
  Run({.work = kRemoval, .commandLine = "/u /r", .workButtons = {IDC_REMOVE}}, Machine::kUpToDate,
      {1050, 165, 60, 45});
}

}  // namespace

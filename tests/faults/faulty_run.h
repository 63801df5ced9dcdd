// One run of the program on a stand-in machine, in a process of its own, with a fault in it.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "machine/settings.h"
#include "tests/support/machine_state.h"

enum Work : unsigned { kInstall = 1, kRemoval = 2, kHelp = 4 };

struct RunKind {
  Work work = kInstall;
  std::string commandLine = {};
  std::string image = "drive_c/setup.exe";
  // Of a dialog: the buttons with which its user starts the work, the first that is there.
  std::vector<int> workButtons = {};
  // Faults that strike each run of this kind, and don't count.
  std::vector<machine::Fault> always = {};

  bool IsDialog() const { return !workButtons.empty(); }
};

inline constexpr char kAllocation[] = "allocation";
inline constexpr char kCancel[] = "cancel";

// A fault of a function of the seam or of kAllocation, or kCancel: the user of a dialog cancels
// while the n-th poll of a pass looks for messages. An empty name: none.
using Injection = machine::Fault;

enum class RunEnd {
  kReturned,
  kStopped,  // by a `stop` fault
  kStuck,    // its user found no way out of the dialog
  kCrashed,  // by a signal, a sanitizer, or after ten seconds without an end
};

struct RunReport {
  RunEnd end = RunEnd::kCrashed;
  int code = 0;
  int strikes = 0;             // of the injected fault
  bool struckLog = false;      // one of them while a log was written
  int leakedBlocks = 0;        // of memory
  char openObjects[256] = {};  // as the stand-in counts them
};

// Runs the program on the machine in `folder`, which must hold neither log nor report yet.
RunReport RunWithFault(const RunKind& kind, const Injection& injection,
                       const std::filesystem::path& folder);

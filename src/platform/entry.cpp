// What a process does before and around the run. Everything else is in the library beside it, so
// that tests link the same code.
#include "platform/entry.h"

#include "core/command_line.h"
#include "core/driver.h"
#include "platform/procedure.h"
#include "platform/win32.h"

namespace {

// A library that lies beside the program, in a folder of downloads perhaps, must not be loaded for
// one of the system's. The import table's are loaded by now, and of those the NT family takes its
// own whatever lies beside the program; but they load others by their bare names. Unread: a system
// without the function, or one that refuses, is served as it always was.
void LoadLibrariesFromSystemDirectory() {
  const auto setDirectories = FindProcedure<decltype(&SetDefaultDllDirectories)>(
      GetModuleHandleA("kernel32.dll"), "SetDefaultDllDirectories");
  if (setDirectories != nullptr) (void)setDirectories(LOAD_LIBRARY_SEARCH_SYSTEM32);
}

}  // namespace

int RunProgram() {
  LoadLibrariesFromSystemDirectory();
  // Nobody may be there to answer a box of the system's about an empty drive; the call fails.
  SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX);
  SetupRequest request = {};
  request.language = kLanguageNone;
  if (ParseCommandLine(SkipProgramName(GetCommandLineA()), &request) == 0) {
    request.options = kDefaultOptions;
  }
  return RunSetup(request);
}

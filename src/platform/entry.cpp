// The program's entry. Everything else is in the library beside it, so that tests link the same
// code.
#include "core/command_line.h"
#include "core/driver.h"
#include "platform/procedure.h"
#include "platform/win32.h"

namespace {

// A library that lies beside the program, in a folder of downloads perhaps, must not be loaded for
// one of the system's. The libraries of the import table can't be replaced that way, since Windows
// knows them all; but those load others by their bare names. Unread: a system without the function,
// or one that refuses, is served as it always was.
void LoadLibrariesFromSystemDirectory() {
  const auto setDirectories = FindProcedure<decltype(&SetDefaultDllDirectories)>(
      GetModuleHandleA("kernel32.dll"), "SetDefaultDllDirectories");
  if (setDirectories != nullptr) (void)setDirectories(LOAD_LIBRARY_SEARCH_SYSTEM32);
}

}  // namespace

// Of the four arguments only the command line, the text behind the program's name, is read.
int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR commandLine, int) {
  LoadLibrariesFromSystemDirectory();
  SetupRequest request = {};
  request.language = kLanguageNone;
  if (ParseCommandLine(commandLine, &request) == 0) request.options = kDefaultOptions;
  return RunSetup(request);
}

// The program's entry. Everything else is in the library beside it, so that tests link the same
// code.
#include "core/command_line.h"
#include "core/driver.h"
#include "platform/win32.h"

// Of the four arguments only the command line, the text behind the program's name, is read.
int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR commandLine, int) {
  SetupRequest request = {};
  request.language = kLanguageNone;
  if (ParseCommandLine(commandLine, &request) == 0) request.options = kDefaultOptions;
  return RunSetup(request);
}

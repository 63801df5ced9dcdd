#include "tests/windows/driven_program.h"

#include <cstdio>
#include <cstdlib>

namespace {

std::string reportPath;
std::FILE* report = nullptr;
PROCESS_INFORMATION process;

}  // namespace

bool OpenReport(const char* path) {
  reportPath = path;
  report = std::fopen(path, "wb");
  return report != nullptr;
}

void Print(const std::string& line) {
  std::fputs((line + "\n").c_str(), report);
  std::fflush(report);
}

void Fail(const std::string& what) {
  Print("failed: " + what);
  // Its own file is free again only when it is gone.
  TerminateProcess(process.hProcess, 1);
  WaitForSingleObject(process.hProcess, 10000);
  std::exit(1);
}

void WaitForPicture(const std::string& name) {
  Sleep(10 * kStepTime);  // until all is drawn
  Print("picture " + name);
  for (int look = 0; look < kMostLooks; ++look) {
    if (GetFileAttributesA((reportPath + "." + name).c_str()) != INVALID_FILE_ATTRIBUTES) return;
    Sleep(kStepTime);
  }
  Fail("nobody took the picture " + name);
}

bool StartProgram(const char* path, std::string commandLine) {
  STARTUPINFOA startup = {};
  startup.cb = sizeof startup;
  return CreateProcessA(path, commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, "C:\\",
                        &startup, &process) != FALSE;
}

const PROCESS_INFORMATION& DrivenProcess() {
  return process;
}

bool HasEnded() {
  return WaitForSingleObject(process.hProcess, 0) == WAIT_OBJECT_0;
}

int ExitCodeOfProgram() {
  DWORD code = 0;
  GetExitCodeProcess(process.hProcess, &code);
  return static_cast<int>(code);
}

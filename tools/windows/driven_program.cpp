#include "tools/windows/driven_program.h"

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

void LetDraw() {
  Sleep(10 * kStepTime);
}

void WaitForPicture(const std::string& name) {
  LetDraw();
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

void WithCopyInProgram(const void* bytes, size_t size, const std::function<void(void*)>& use) {
  const HANDLE program = process.hProcess;
  void* const place =
      VirtualAllocEx(program, nullptr, size, MEM_COMMIT | MEM_RESERVE, PAGE_READWRITE);
  WriteProcessMemory(program, place, bytes, size, nullptr);
  use(place);
  VirtualFreeEx(program, place, 0, MEM_RELEASE);
}

// kernel32 lies at the same address in all processes.
void LoadLibraryInProgram(const std::string& name) {
  WithCopyInProgram(name.c_str(), name.size() + 1, [](void* place) {
    const auto load =
        reinterpret_cast<LPTHREAD_START_ROUTINE>(reinterpret_cast<void*>(LoadLibraryA));
    const HANDLE thread = CreateRemoteThread(process.hProcess, nullptr, 0, load, place, 0, nullptr);
    WaitForSingleObject(thread, 10000);
    CloseHandle(thread);
  });
}

bool HasEnded() {
  return WaitForSingleObject(process.hProcess, 0) == WAIT_OBJECT_0;
}

int ExitCodeOfProgram() {
  DWORD code = 0;
  GetExitCodeProcess(process.hProcess, &code);
  return static_cast<int>(code);
}

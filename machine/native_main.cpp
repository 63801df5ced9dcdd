// The native program's entry: starts the machine that MORIV_MACHINE names, runs the program on it,
// with the user whose script MORIV_USER names, and tells the exit code that a Linux exit status has
// no room for.
#include <cstdio>
#include <cstdlib>
#include <string>

#include "machine/code_page.h"
#include "machine/drives.h"
#include "machine/machine.h"
#include "machine/scripted_user.h"
#include "platform/entry.h"

namespace {

constexpr int kUnusableMachineStatus = 2;
constexpr int kOpenObjectsStatus = 3;
constexpr int kFirstSoftCode = 100001;

// The program's name in quotes, then the arguments, a blank before each and nothing quoted.
std::string JoinCommandLine(int count, char** arguments) {
  std::string line = '"' + machine::ImagePath() + '"';
  for (int i = 1; i < count; ++i) line += ' ' + machine::FromUtf8(arguments[i]);
  return line;
}

// 0 for a help, a success and a soft failure.
int ExitStatus(int code) {
  return code == 0 || code == 1 || code >= kFirstSoftCode ? 0 : 1;
}

}  // namespace

int main(int argc, char** argv) {
  const char* const named = std::getenv("MORIV_MACHINE");
  const std::filesystem::path folder = named != nullptr && *named != '\0' ? named : "machine";
  std::string error;
  if (!machine::Start(folder, "/proc/self/exe", &error)) {
    std::fprintf(stderr, "%s\n", error.c_str());
    return kUnusableMachineStatus;
  }

  const char* const script = std::getenv("MORIV_USER");
  if (script != nullptr && *script != '\0' && !machine::LoadUser(script, &error)) {
    std::fprintf(stderr, "%s\n", error.c_str());
    return kUnusableMachineStatus;
  }
  machine::CurrentSettings().commandLine = JoinCommandLine(argc, argv);
  const int code = RunProgram();
  machine::EndUser();
  const std::string open = machine::Stop();

  std::printf("exit code: %d\n", code);
  if (open.empty()) return ExitStatus(code);
  std::fflush(stdout);
  std::fprintf(stderr, "open at exit: %s\n", open.c_str());
  return kOpenObjectsStatus;
}

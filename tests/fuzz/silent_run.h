// Silent runs in the fuzzer's own process, and what holds after each of them.
#pragma once

#include <filesystem>
#include <map>
#include <string>

#include "core/command_line.h"
#include "core/driver.h"
#include "machine/open_objects.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/documented_codes.h"
#include "tests/support/test_machine.h"

// Runs the program from `image`, a file in the machine's folder, as its entry does. It ends with a
// code that is documented for such a run, and neither memory nor the system's directories lack.
inline StatusCode RunSilently(TestMachine& pc, const std::string& image, const char* commandLine) {
  pc.Restart(image);
  SetupRequest request = {};
  request.language = kLanguageNone;
  EXPECT_EQ(ParseCommandLine(commandLine, &request), 1);
  const StatusCode code = RunSetup(request);
  EXPECT_TRUE(IsSilentEnd(code, "install") || IsSilentEnd(code, "removal")) << code;
  EXPECT_TRUE(code != StatusNoMemory && code != StatusNoSystemDir) << code;
  EXPECT_EQ(machine::OpenObjects(), "");
  return code;
}

// The bytes of every file on the machine's drives, by its host path.
inline std::map<std::filesystem::path, std::string> FilesOf(const TestMachine& pc) {
  std::map<std::filesystem::path, std::string> files;
  const std::filesystem::path drive = pc.Host("drive_c");
  for (const auto& entry : std::filesystem::recursive_directory_iterator(drive)) {
    if (!entry.is_regular_file()) continue;
    files[entry] = pc.Read(std::filesystem::relative(entry, pc.Host("")).string());
  }
  return files;
}

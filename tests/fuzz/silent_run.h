// Silent runs in the fuzzer's own process, and what holds after each of them.
#pragma once

#include "core/command_line.h"
#include "core/driver.h"
#include "machine/open_objects.h"
#include "tests/fuzz/fuzz_target.h"
#include "tests/support/documented_codes.h"

inline constexpr char kImage[] = "drive_c/setup.exe";

// Runs the program from `image`, a file in the machine's folder, as its entry does. It ends with a
// code that is documented for such a run, and neither memory nor the system's directories lack.
inline StatusCode RunSilently(TestMachine& pc, const std::string& image, const char* commandLine) {
  pc.Restart(image);
  SetupRequest request = {};
  request.language = kLanguageNone;
  EXPECT_EQ(ParseCommandLine(commandLine, &request), 1);
  const StatusCode code = RunSetup(request);
  EXPECT_TRUE(IsSilentEnd(code, "Install") || IsSilentEnd(code, "Removal")) << code;
  EXPECT_TRUE(code != StatusNoMemory && code != StatusNoSystemDir) << code;
  EXPECT_EQ(machine::OpenObjects(), "");
  return code;
}

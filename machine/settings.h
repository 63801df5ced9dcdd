// What machine.ini says of a stand-in machine.
#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "machine/code_page.h"
#include "platform/win32.h"

namespace machine {

// One line of [faults]. `fail` makes calls fail, `short` makes them move fewer bytes than they were
// asked to; `stop` ends the process at the call. Both of the last two (tests alone ask for that):
// it ends when part of the bytes went through.
struct Fault {
  std::string function;     // a function of the seam, by its Win32 name
  int call = 1;             // counted from 1
  bool fromThenOn = false;  // this call and all later ones
  bool isShort = false;
  bool stop = false;
  DWORD error = ERROR_ACCESS_DENIED;
};

// One [disk X].
struct DiskSettings {
  uint64_t freeBytes = uint64_t{10} << 30;  // free to the caller
  std::optional<uint64_t> writable;         // bytes that can still be written before it is full
  bool readOnly = false;
};

struct Settings {
  bool ntFamily = true;  // else the 9x family
  LANGID language = 0x0409;
  int codePage = kUsualCodePage;
  std::string windowsDirectory = "C:\\windows";
  std::string systemDirectory = "C:\\windows\\system32";
  std::optional<SYSTEMTIME> now;  // else the real local time
  std::map<char, DiskSettings>
      disks;  // by upper-case drive letter; a drive without one has the defaults
  bool hasGetDiskFreeSpaceEx = true;
  bool hasReadOnlyRegistry = false;  // no key opens for more than reading, as for a plain user
  std::vector<Fault> faults;
  std::string commandLine;  // of the program that runs, with its name; no setting of the file
};

// Reads a machine.ini. A missing file leaves the defaults. On bad input (an unknown section or key,
// a value out of its form) returns false with one line in `error` that names file, line and key.
bool ReadSettings(const std::filesystem::path& file, Settings* settings, std::string* error);

}  // namespace machine

// What a silent run of a setup image would do to a machine. All texts are UTF-8.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/status.h"

namespace image {

// A file of the package at one place. An install that fails lists all places that it knows.
struct PlannedPlace {
  int record = 0;  // from 1
  std::string path = {};
  uint64_t size = 0;  // of the file in the package
  // What stands there now: "nothing", or by the program's own comparison an "older", "newer" or
  // "equal" file, or one "without version".
  std::string replaces = {};
  std::string replacedVersion = {};  // "4.1.7"; empty without one
  uint64_t replacedSize = 0;
  bool isChanged = false;  // the run writes or deletes it
  bool stands = false;     // something stands there after the run
};

enum class Change { kAdded, kChanged, kRemoved };

struct FileSystemChange {
  Change change = Change::kAdded;
  std::string path = {};  // a folder's ends in a backslash
  uint64_t size = 0;      // after the run
  std::string role = {};  // "log", "removal program", "file of the package" or empty
};

struct RegistryChange {
  Change change = Change::kAdded;
  std::string key = {};                   // in full; of one that goes the values are not listed
  std::optional<std::string> value = {};  // without it the key itself; "" is the default value
  uint32_t type = 0;                      // as it is after the run, or was when it goes
  std::string data = {};                  // in hexadecimal digits
  std::string text = {};                  // of a REG_SZ
};

struct DriveUse {
  char drive = 0;
  bool isInstallDrive = false;        // whose free space the program compares
  uint64_t bytes = 0;                 // of all places, and of other files that the run writes
  std::optional<uint64_t> free = {};  // as the program is told
};

struct StayingPath {
  std::string path = {};
  std::string reason = {};
};

struct RunPlan {
  std::string image = {}, machine = {};  // as they were given; "" for a fresh machine
  std::string arguments = {};            // of the run
  bool isRemoval = false;

  std::optional<StatusCode> exitCode = {};  // none: a fault of the machine's stops the process
  std::string event = {};                   // that decides it, as the log has it; empty for none

  std::vector<std::string> log = {};  // the lines of all its events

  // What the program settles before it works; empty when it doesn't come so far.
  std::string directory, directoryReason;
  std::optional<int32_t> language = {};
  std::string languageReason = {};
  uint32_t spaceNeeded = 0;
  std::vector<PlannedPlace> places = {};
  std::string longestPath = {};  // of a place or the removal program
  size_t longestLength = 0;      // in the machine's characters

  std::vector<DriveUse> drives = {};
  std::vector<FileSystemChange> files = {};  // all, also those of `places`, sorted by path
  std::vector<RegistryChange> registry = {};

  // Of a removal
  std::vector<StayingPath> stays = {};
  std::vector<std::string> deletedAtNextStart = {};
};

}  // namespace image

// What stands on a stand-in machine, and what a run has changed of it.
#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

#include "tools/planner/run_plan.h"

namespace image {

struct FileFacts {
  bool isFolder = false;
  uint64_t size = 0;
  std::filesystem::file_time_type written = {};
  std::filesystem::perms permissions = {};
  bool operator==(const FileFacts&) const = default;
};

// Of the machine that runs: by path, a folder's with a backslash at its end; and of its registry
// all keys and values below HKEY_LOCAL_MACHINE, by names without case.
struct MachineContents {
  std::map<std::string, FileFacts> files;
  std::map<std::string, RegistryChange> registry;
};

MachineContents ReadMachineContents();

// Gives every file of the machine that runs one time long ago, so that a file that is written from
// now on differs in it, even one of the same size in the same instant.
void AgeMachineFiles();

// The full path of a file or folder of the machine that runs, by its path on the host.
std::string DosPathOf(const std::filesystem::path& host);

std::vector<FileSystemChange> CompareFiles(const MachineContents& before,
                                           const MachineContents& after);
std::vector<RegistryChange> CompareRegistry(const MachineContents& before,
                                            const MachineContents& after);

}  // namespace image

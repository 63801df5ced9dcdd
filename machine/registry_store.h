// The registry of the stand-in machine: a tree in memory, kept in one file of REGEDIT4 text.
#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "platform/win32.h"

namespace machine {

struct RegistryValue {
  std::string name;            // "" is the default value
  DWORD type = REG_SZ;
  std::vector<uint8_t> data;   // the exact bytes given
};

// Keys and values keep the order of their making; names compare without regard to case.
struct RegistryKey {
  std::string name;
  RegistryKey* parent = nullptr;
  std::vector<RegistryValue> values;
  std::vector<std::shared_ptr<RegistryKey>> subkeys;
  bool deleted = false;  // an open handle to a deleted key stays valid and answers an error
};

// Reads the file (a missing one gives a fresh registry). False with "FILE:LINE: what" in `error`.
bool LoadRegistry(const std::filesystem::path& file, std::string* error);
// Writes the whole file, by rename. Called at each change.
void SaveRegistry();
void CloseRegistry();

// The key of a path like "SOFTWARE\\Zeb" under `root`; null when there is none.
std::shared_ptr<RegistryKey> FindKey(const std::shared_ptr<RegistryKey>& root,
                                     const std::string& path);
// The same, made with all its parents when missing (not saved).
std::shared_ptr<RegistryKey> MakeKey(const std::shared_ptr<RegistryKey>& root,
                                     const std::string& path);
RegistryValue* FindValue(RegistryKey& key, const std::string& name);
std::shared_ptr<RegistryKey> LocalMachine();

}  // namespace machine

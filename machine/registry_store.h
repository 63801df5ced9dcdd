// The registry of the stand-in machine: a tree in memory, kept in one file of REGEDIT4 text.
#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/win32.h"

namespace machine {

struct RegistryValue {
  std::string name;  // "" is the default value
  DWORD type = REG_SZ;
  std::vector<uint8_t> data;  // the exact bytes given
};

// Keys and values keep the order of their making; names compare without regard to case.
struct RegistryKey {
  std::string name;
  RegistryKey* parent = nullptr;
  std::vector<RegistryValue> values;
  std::vector<std::shared_ptr<RegistryKey>> subkeys;
  bool deleted = false;  // an open handle to a deleted key stays valid and answers an error
};

// Reads the file (a missing one gives a fresh registry). False with "FILE: what" or
// "FILE:LINE: what" in `error`.
bool LoadRegistry(const std::filesystem::path& file, std::string* error);
// Writes the whole file, by rename. Called at each change.
void SaveRegistry();
void CloseRegistry();

// The names of a key path, without empty ones: backslashes at the end and doubled ones do not
// count. nullopt for a name above 255 characters or with a control character (Windows takes those;
// a file of lines can't hold them), and for a path of more than 512 names.
std::optional<std::vector<std::string>> SplitKeyPath(std::string_view path);
// At most 16383 characters, no control character.
bool IsValueName(std::string_view name);

// Where the keys of HKEY_CLASSES_ROOT lie under HKEY_LOCAL_MACHINE.
inline constexpr char kClassesPath[] = "SOFTWARE\\Classes";

// The key of a path like "SOFTWARE\\Zeb" under `root`; null when there is none.
std::shared_ptr<RegistryKey> FindKey(const std::shared_ptr<RegistryKey>& root,
                                     const std::string& path);
// The same, made with all its parents when missing (not saved); null for a bad path.
std::shared_ptr<RegistryKey> MakeKey(const std::shared_ptr<RegistryKey>& root,
                                     const std::string& path);
// Takes the key, which is no root, and all below it out of the tree (not saved).
void DeleteKey(RegistryKey* key);
RegistryValue* FindValue(RegistryKey& key, const std::string& name);
std::shared_ptr<RegistryKey> LocalMachine();

}  // namespace machine

#include "machine/registry_store.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <string_view>

#include "machine/code_page.h"
#include "machine/host_file.h"
#include "machine/registry_text.h"

namespace machine {
namespace {

constexpr size_t kMaxKeyDepth = 512;
constexpr size_t kMaxKeyName = 255;
constexpr size_t kMaxValueName = 16383;

std::filesystem::path registryFile;
std::optional<RegistryRoots> registryRoots;

bool IsName(std::string_view name, size_t maxSize) {
  return name.size() <= maxSize && std::none_of(name.begin(), name.end(), [](char byte) {
           return static_cast<unsigned char>(byte) < 0x20;
         });
}

std::shared_ptr<RegistryKey> FindSubkey(const RegistryKey& key, std::string_view name) {
  const auto found = std::find_if(key.subkeys.begin(), key.subkeys.end(), [&](const auto& subkey) {
    return EqualNoCase(subkey->name, name);
  });
  return found == key.subkeys.end() ? nullptr : *found;
}

std::shared_ptr<RegistryKey> MakeSubkey(const std::shared_ptr<RegistryKey>& key,
                                        std::string_view name) {
  if (std::shared_ptr<RegistryKey> old = FindSubkey(*key, name)) return old;
  auto subkey = std::make_shared<RegistryKey>();
  subkey->name = name;
  subkey->parent = key.get();
  key->subkeys.push_back(subkey);
  return subkey;
}

// Open handles outlive the tree: they must see that theirs is gone.
void MarkDeleted(RegistryKey* key) {
  key->deleted = true;
  key->parent = nullptr;
  for (const auto& subkey : key->subkeys) MarkDeleted(subkey.get());
}

void MakeSystemKeys(const RegistryRoots& roots) {
  for (const char* path :
       {"SOFTWARE", "SOFTWARE\\Classes", "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\Uninstall",
        "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\RunOnce",
        "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\App Paths"}) {
    MakeKey(roots.localMachine, path);
  }
}

}  // namespace

std::optional<std::vector<std::string>> SplitKeyPath(std::string_view path) {
  std::vector<std::string> names;
  while (!path.empty()) {
    const size_t end = std::min(path.find('\\'), path.size());
    const std::string_view name = path.substr(0, end);
    path.remove_prefix(std::min(end + 1, path.size()));
    if (name.empty()) continue;
    if (!IsName(name, kMaxKeyName)) return std::nullopt;
    names.emplace_back(name);
  }
  if (names.size() > kMaxKeyDepth) return std::nullopt;
  return names;
}

bool IsValueName(std::string_view name) {
  return IsName(name, kMaxValueName);
}

bool LoadRegistry(const std::filesystem::path& file, std::string* error) {
  RegistryRoots roots;
  std::optional<std::string> text;
  if (!ReadOwnFile(file, &text, error)) return false;
  if (!text) {
    MakeSystemKeys(roots);
  } else if (!ReadRegistryText(*text, roots, error)) {
    *error = file.filename().string() + ':' + *error;
    return false;
  }
  CloseRegistry();
  registryFile = file;
  registryRoots = roots;
  return true;
}

// A registry that can't be kept would make every later answer a lie: the process ends.
void SaveRegistry() {
  if (!registryRoots) return;
  if (ReplaceHostFile(registryFile, WriteRegistryText(*registryRoots))) return;
  std::fprintf(stderr, "%s: the registry can't be written\n", registryFile.c_str());
  std::exit(EXIT_FAILURE);
}

void CloseRegistry() {
  if (!registryRoots) return;
  MarkDeleted(registryRoots->localMachine.get());
  MarkDeleted(registryRoots->currentUser.get());
  registryRoots.reset();
}

std::shared_ptr<RegistryKey> FindKey(const std::shared_ptr<RegistryKey>& root,
                                     const std::string& path) {
  const auto names = SplitKeyPath(path);
  if (!names) return nullptr;
  std::shared_ptr<RegistryKey> key = root;
  for (const std::string& name : *names) {
    if (key != nullptr) key = FindSubkey(*key, name);
  }
  return key;
}

std::shared_ptr<RegistryKey> MakeKey(const std::shared_ptr<RegistryKey>& root,
                                     const std::string& path) {
  const auto names = SplitKeyPath(path);
  if (!names) return nullptr;
  std::shared_ptr<RegistryKey> key = root;
  for (const std::string& name : *names) key = MakeSubkey(key, name);
  return key;
}

void DeleteKey(RegistryKey* key) {
  const RegistryKey* child = key;
  std::vector<std::shared_ptr<RegistryKey>>& siblings = key->parent->subkeys;
  const auto place = std::find_if(siblings.begin(), siblings.end(),
                                  [&](const auto& sibling) { return sibling.get() == child; });
  MarkDeleted(key);
  siblings.erase(place);
}

RegistryValue* FindValue(RegistryKey& key, const std::string& name) {
  const auto found = std::find_if(key.values.begin(), key.values.end(),
                                  [&](const auto& value) { return EqualNoCase(value.name, name); });
  return found == key.values.end() ? nullptr : &*found;
}

std::shared_ptr<RegistryKey> LocalMachine() {
  return registryRoots ? registryRoots->localMachine : nullptr;
}

}  // namespace machine

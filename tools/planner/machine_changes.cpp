#include "tools/planner/machine_changes.h"

#include <cstdio>
#include <functional>
#include <set>

#include "machine/code_page.h"
#include "machine/machine.h"
#include "machine/registry_store.h"
#include "tools/image/host_text.h"
#include "tools/image/record_text.h"

namespace fs = std::filesystem;

namespace image {
namespace {

constexpr char kRoot[] = "HKEY_LOCAL_MACHINE";

void ForEachEntry(const std::function<void(const fs::directory_entry&)>& take) {
  for (char letter = 'a'; letter <= 'z'; ++letter) {
    const fs::path drive = machine::Folder() / (std::string("drive_") + letter);
    if (!fs::is_directory(drive)) continue;
    for (const auto& entry : fs::recursive_directory_iterator(drive)) take(entry);
  }
}

FileFacts FactsOf(const fs::directory_entry& entry) {
  const fs::file_status status = entry.symlink_status();
  if (status.type() != fs::file_type::regular)
    return {.isFolder = status.type() == fs::file_type::directory};
  return {.size = entry.file_size(),
          .written = entry.last_write_time(),
          .permissions = status.permissions()};
}

std::string HexOf(const std::vector<uint8_t>& bytes) {
  std::string digits;
  for (const uint8_t byte : bytes) {
    char pair[3];
    std::snprintf(pair, sizeof pair, "%02x", byte);
    digits += pair;
  }
  return digits;
}

std::string TextOfValue(const machine::RegistryValue& value) {
  std::string text(value.data.begin(), value.data.end());
  if (text.ends_with('\0')) text.pop_back();
  return machine::ToUtf8(text);
}

// The names of a key and of a value in it can't have what stands between them here.
void AddKey(const machine::RegistryKey& key, const std::string& path,
            std::map<std::string, RegistryChange>* facts) {
  const std::string place = ToUpper(path) + '\1';
  const std::string shown = machine::ToUtf8(path);
  (*facts)[place] = {.key = shown};
  for (const machine::RegistryValue& value : key.values) {
    RegistryChange fact = {.key = shown,
                           .value = machine::ToUtf8(value.name),
                           .type = value.type,
                           .data = HexOf(value.data)};
    if (value.type == REG_SZ) fact.text = TextOfValue(value);
    (*facts)[place + '\2' + ToUpper(value.name)] = fact;
  }
  for (const auto& subkey : key.subkeys) AddKey(*subkey, path + '\\' + subkey->name, facts);
}

// Goes over what differs of two maps, in their order; a null side has nothing there.
template <class Map, class Take>
void ForEachDifference(const Map& before, const Map& after, const Take& take) {
  std::set<std::string> names;
  for (const Map* map : {&before, &after})
    for (const auto& [name, facts] : *map) names.insert(name);
  for (const std::string& name : names) {
    const auto was = before.find(name), is = after.find(name);
    if (was == before.end())
      take(name, Change::kAdded, is->second);
    else if (is == after.end())
      take(name, Change::kRemoved, was->second);
    else
      take(name, Change::kChanged, is->second);
  }
}

}  // namespace

MachineContents ReadMachineContents() {
  MachineContents contents;
  ForEachEntry([&contents](const fs::directory_entry& entry) {
    const FileFacts facts = FactsOf(entry);
    contents.files[DosPathOf(entry.path()) + (facts.isFolder ? "\\" : "")] = facts;
  });
  AddKey(*machine::LocalMachine(), kRoot, &contents.registry);
  return contents;
}

void AgeMachineFiles() {
  ForEachEntry([](const fs::directory_entry& entry) {
    if (entry.symlink_status().type() == fs::file_type::regular)
      fs::last_write_time(entry.path(), fs::file_time_type::clock::now() - std::chrono::years(20));
  });
}

std::string DosPathOf(const fs::path& host) {
  std::string path;
  for (const fs::path& name : host.lexically_relative(machine::Folder())) {
    const std::string text = TextOf(name);
    path += path.empty() ? std::string{static_cast<char>(text.back() & ~0x20), ':'} : '\\' + text;
  }
  return path;
}

std::vector<FileSystemChange> CompareFiles(const MachineContents& before,
                                           const MachineContents& after) {
  std::vector<FileSystemChange> changes;
  ForEachDifference(before.files, after.files,
                    [&](const std::string& path, Change change, const FileFacts& facts) {
                      if (change == Change::kChanged && before.files.at(path) == facts) return;
                      changes.push_back({change, path, facts.size, ""});
                    });
  return changes;
}

std::vector<RegistryChange> CompareRegistry(const MachineContents& before,
                                            const MachineContents& after) {
  std::vector<RegistryChange> changes;
  ForEachDifference(before.registry, after.registry,
                    [&](const std::string& place, Change change, RegistryChange fact) {
                      if (change == Change::kChanged) {
                        const RegistryChange& was = before.registry.at(place);
                        if (was.type == fact.type && was.data == fact.data) return;
                      }
                      // A key that goes takes its values along.
                      const std::string key = place.substr(0, place.find('\1') + 1);
                      if (change == Change::kRemoved && fact.value && !after.registry.contains(key))
                        return;
                      fact.change = change;
                      changes.push_back(std::move(fact));
                    });
  return changes;
}

}  // namespace image

#include "tests/faults/machine_state.h"

#include <fstream>
#include <sstream>

#include "machine/host_file.h"

namespace fs = std::filesystem;

namespace {

// The names in this registry hold no equals sign.
void AddRegistry(const std::string& text, std::map<std::string, std::string>* items) {
  std::istringstream lines(text);
  std::string key;
  for (std::string line; std::getline(lines, line);) {
    const size_t equals = line.find('=');
    if (line.starts_with("[")) {
      key = "registry " + line;
      (*items)[key] = "a key";
    } else if (equals != std::string::npos) {
      (*items)[key + " " + line.substr(0, equals)] = line.substr(equals);
    }
  }
}

}  // namespace

MachineState ReadMachine(const fs::path& folder) {
  MachineState state;
  for (const fs::directory_entry& entry : fs::recursive_directory_iterator(folder)) {
    std::string& content = state.files[entry.path().lexically_relative(folder)];
    if (entry.is_directory()) {
      content = kFolder;
    } else if (const auto bytes = machine::ReadHostFile(entry.path())) {
      content.assign(bytes->begin(), bytes->end());
    }
  }
  state.items = state.files;
  for (const char* path : {kLogPath, kReportPath, "registry.reg"}) state.items.erase(path);
  AddRegistry(state.files["registry.reg"], &state.items);
  return state;
}

void WriteMachine(const fs::path& folder, const MachineState& state) {
  fs::remove_all(folder);
  fs::create_directories(folder);
  for (const auto& [path, content] : state.files) {  // a folder comes ahead of what is in it
    if (content == kFolder) {
      fs::create_directory(folder / path);
    } else {
      std::ofstream(folder / path, std::ios::binary) << content;
    }
  }
}

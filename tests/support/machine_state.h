// All that stands on a stand-in machine, to be compared with what stood there.
#pragma once

#include <filesystem>
#include <fstream>
#include <map>
#include <string>

#include "tests/support/test_machine.h"

// Log, and report file of all runs, as paths below the machine's folder.
inline constexpr char kLogPath[] = "drive_c/windows/MorivLog.txt";
inline constexpr char kReportPath[] = "drive_c/report.txt";

inline constexpr char kFolder[] = "a folder";

struct MachineState {
  // Path below the folder -> the bytes of the file, or kFolder.
  std::map<std::string, std::string> files;

  // What the machine is made of, each thing on its own: the files without log and report, and in
  // place of registry.reg its keys ("registry [KEY]") and values ("registry [KEY] NAME" -> data).
  std::map<std::string, std::string> items;
};

inline MachineState ReadMachine(const std::filesystem::path& folder) {
  MachineState state;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(folder)) {
    state.files[entry.path().lexically_relative(folder)] =
        entry.is_directory() ? kFolder : FileBytes(entry.path());
  }
  state.items = state.files;
  for (const char* path : {kLogPath, kReportPath, "registry.reg"}) state.items.erase(path);
  std::istringstream lines(state.files["registry.reg"]);
  std::string key;
  for (std::string line; std::getline(lines, line);) {
    const size_t equals = line.find('=');  // there is none in a name here
    if (line.starts_with("["))
      state.items[key = "registry " + line] = "a key";
    else if (equals != std::string::npos)
      state.items[key + " " + line.substr(0, equals)] = line.substr(equals);
  }
  return state;
}

// Makes the folder hold the files of this state and nothing else.
inline void WriteMachine(const std::filesystem::path& folder, const MachineState& state) {
  std::filesystem::remove_all(folder);
  std::filesystem::create_directories(folder);
  for (const auto& [path, content] : state.files) {  // a folder comes ahead of what is in it
    if (content == kFolder)
      std::filesystem::create_directory(folder / path);
    else
      std::ofstream(folder / path, std::ios::binary) << content;
  }
}

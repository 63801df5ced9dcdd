// All that stands on a stand-in machine, to be put back and compared.
#pragma once

#include <filesystem>
#include <map>
#include <string>

// The log and the report file of all runs, as paths below the machine's folder.
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

MachineState ReadMachine(const std::filesystem::path& folder);

// Makes the folder hold the files of this state and nothing else.
void WriteMachine(const std::filesystem::path& folder, const MachineState& state);

// What the system does at its next start.
#include <gtest/gtest.h>

#include "machine/registry_store.h"
#include "tests/support/test_machine.h"

namespace {

constexpr char kInf[] =
    "[Version]\r\nSignature=$Chicago$\r\nAdvancedINF=2.0\r\n\r\n"
    "[Uninstall]\r\nDelFiles=RemoveFiles\r\n\r\n"
    "[RemoveFiles]\r\nMorivRmv.exe\r\nMorivLog.txt\r\nMoriv.INF\r\n\r\n"
    "[DestinationDirs]\r\nRemoveFiles = 10\r\n";

std::vector<machine::RegistryValue>& RunOnce() {
  return machine::FindKey(machine::LocalMachine(),
                          "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\RunOnce")
      ->values;
}

void Add(const std::string& name, const std::string& command) {
  machine::RegistryValue& value = RunOnce().emplace_back();
  value.name = name;
  value.data.assign(command.c_str(), command.c_str() + command.size() + 1);
}

TEST(Restart, UnderstandsTheOtherFamilyAndBlanksInPaths) {
  TestMachine pc("[system]\nwindows = C:\\My Windows\n");
  for (const std::string folder : {"drive_c/My Windows/", "drive_c/windows/"}) {
    pc.Write(folder + "MorivRmv.exe", "program");
    pc.Write(folder + "Moriv.INF", kInf);
  }
  Add("MorivCommand",
      "C:\\My Windows\\rundll.exe setupx.dll,InstallHinfSection Uninstall 132 "
      "C:\\My Windows\\Moriv.INF ");
  machine::Restart();
  EXPECT_FALSE(pc.Has("drive_c/My Windows/MorivRmv.exe") || pc.Has("drive_c/My Windows/Moriv.INF"));
  EXPECT_TRUE(pc.Has("drive_c/windows/MorivRmv.exe") && pc.Has("drive_c/windows/Moriv.INF"));
}

TEST(Restart, EveryValueGoesInOrderWhateverBecomesOfIt) {
  TestMachine pc;
  for (const char* name : {"MorivRmv.exe", "Other.exe"}) {
    pc.Write(std::string("drive_c/windows/") + name, "program");
  }
  pc.Write("drive_c/windows/Moriv.INF", kInf);
  pc.Write("drive_c/unsigned.inf", "[Uninstall]\nDelFiles=RemoveFiles\n");
  pc.Write("drive_c/elsewhere.inf",
           "[Version]\nSignature=\"$Windows NT$\"\n[Uninstall]\nDelFiles=A,B\n"
           "[A]\nMorivRmv.exe\n[B]\nOther.exe\n[DestinationDirs]\nA=11\n");
  const std::string start = "rundll32.exe setupapi.dll,InstallHinfSection ";
  const std::pair<std::string, std::string> rows[] = {
      {"C:\\windows\\notepad.exe", "not understood\n"},
      {start + "Uninstall 132 C:\\absent.inf", "C:\\absent.inf can't be read\n"},
      {start + "Uninstall 132 C:\\unsigned.inf", "C:\\unsigned.inf is no INF file\n"},
      {start + "Absent 132 C:\\windows\\Moriv.INF",
       "C:\\windows\\Moriv.INF has no section Absent\n"},
      {start + "Uninstall 132 C:\\elsewhere.inf",
       "A: the directory 11 is not understood\n  B: the directory  is not understood\n"},
      {start + "Uninstall mode C:\\windows\\Moriv.INF", "not understood\n"},
      {"not" + start + "Uninstall 132 C:\\windows\\Moriv.INF", "not understood\n"},
      {start + "Uninstall 132 C:\\windows\\Moriv.INF",
       "delete C:\\windows\\MorivRmv.exe\n  C:\\windows\\MorivLog.txt is not there\n"
       "  delete C:\\windows\\Moriv.INF\n"},
  };
  std::string told;
  for (const auto& [command, outcome] : rows) {
    const std::string name = std::to_string(told.size());
    Add(name, command);
    told += "run " + name + ": " + command + "\n  " + outcome;
  }
  EXPECT_EQ(machine::Restart(), told);
  EXPECT_TRUE(RunOnce().empty() && pc.Has("drive_c/windows/Other.exe"));
}

}  // namespace

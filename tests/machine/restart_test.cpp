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

TEST(Restart, EveryValueGoesInOrderWhateverBecomesOfIt) {
  TestMachine pc("[system]\nwindows = C:\\My Windows\n");
  for (const std::string folder : {"drive_c/My Windows/", "drive_c/windows/"}) {
    pc.Write(folder + "MorivRmv.exe", "program");
    pc.Write(folder + "Moriv.INF", kInf);
  }
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
      {"C:\\My Windows\\rundll.exe setupx.dll,InstallHinfSection Uninstall 132 "
       "C:\\My Windows\\Moriv.INF ",
       "delete C:\\My Windows\\MorivRmv.exe\n  C:\\My Windows\\MorivLog.txt is not there\n"
       "  delete C:\\My Windows\\Moriv.INF\n"},
  };
  std::string told;
  for (const auto& [command, outcome] : rows) {
    const std::string name = std::to_string(told.size());
    const char* const data = command.c_str();
    RunOnce().push_back({name, REG_SZ, {data, data + command.size() + 1}});
    told += "run " + name + ": " + command + "\n  " + outcome;
  }
  EXPECT_EQ(machine::Restart(), told);
  EXPECT_FALSE(pc.Has("drive_c/My Windows/MorivRmv.exe"));
  EXPECT_TRUE(RunOnce().empty() && pc.Has("drive_c/windows/MorivRmv.exe"));
}

}  // namespace

// moriv-image plan: what a run would do to a machine, which it leaves alone.
#include "tests/support/machine_state.h"
#include "tests/tools/tool_bench.h"

namespace fs = std::filesystem;

namespace {

constexpr char kInstalled[] = R"(REGEDIT4

[HKEY_LOCAL_MACHINE\SOFTWARE\Zeb\Moriv]
"InstallDir"="C:\\Moriv"
"Language"="DE"
)";

}  // namespace

struct RunPlanner : SampleBench {
  RunPlanner() {
    fs::create_directories(Host("tmp"));
    setenv("TMPDIR", Host("tmp").c_str(), 1);  // what it leaves there would be seen
    Write("pc/registry.reg", kInstalled);
    Write("pc/drive_c/windows/system32/moriv/b.dll", "no version");
    Write("pc/drive_c/Moriv/a.exe", VersionedProgram("4.1.6"));
    Write("pc/drive_c/Moriv/letter.txt", "mine");
    Write("full/machine.ini", "[disk C]\nfree = 10\n");
    Write("stopped/machine.ini", "[faults]\nstop = CreateDirectoryA 2\n");
    Write("short/machine.ini", "[disk C]\nwritable = 100\n");
    Write("short/drive_c/Program Files/Moriv/a.exe", VersionedProgram("4.1.8"));
    // Drive D: is a link out of the machine, E: one that stays in it.
    fs::create_directory(Host("outside"));
    fs::create_directories(Host("linked/drive_c/e"));
    fs::create_directory_symlink(Host("outside"), Host("linked/drive_d"));
    fs::create_directory_symlink(Host("linked/drive_c/e"), Host("linked/drive_e"));
    fs::copy_file(Host("image.exe"), Host("linked/drive_c/Setup.exe"));
  }
  ~RunPlanner() override { unsetenv("TMPDIR"); }
};

TEST_F(RunPlanner, SaysWhatARunWouldDoAndLeavesTheMachineAlone) {
  struct Row {
    const char* commandLine;
    int status;
    std::vector<const char*> said;
  };
  const Row rows[] = {
      {"@image.exe --options=/r",
       0,
       {"install with \"/r /s\"", "\"C:\\Program Files\\Moriv\", the package's default",
        "french (10000), the package's", "38 characters, room for 221", "45056  nothing  ",
        "added                      \"C:\\Program Files\\Moriv\\docs\\\"\n",
        "\"C:\\windows\\MorivRmv.exe\", the removal program",
        "added \"DisplayName\" = \"ZEB Machine virtuelle Moriv\"",
        "C: where the package asks for"}},
      {"@image.exe --machine @pc",
       0,
       {"\"C:\\Moriv\", registered", "german (20000), the registered product's", "older 4.1.6, ",
        "without version, 10        \"C:\\windows\\system32\\moriv\\b.dll\"\n"}},
      {"@image.exe --machine @pc --remove",
       0,
       {"removal with \"/u /s\"", "not empty                  \"C:\\Moriv\\\"\n",
        "no file of the package     \"C:\\Moriv\\letter.txt\"\n", "docs\\readme.txt\" (not there)",
        "removed \"HKEY_LOCAL_MACHINE\\SOFTWARE\\Zeb\\Moriv\"\n",
        "deleted at the next start of the system\n", "\"C:\\windows\\Moriv.INF\"\n"}},
      {"@image.exe --dir C:\\my-dir --json",
       0,
       {"\"arguments\": \"/d:C:\\\\my-dir /s\"", "\"exitCode\": 1,",
        "\"directoryReason\": \"given\"", "\"path\": \"C:\\\\my-dir\\\\a.exe\"",
        "\"replacedSize\": 0", "\"installDrive\": true"}},
      {"@image.exe --machine @full",
       1,
       {"-1000020", "Have not enough disk space", "10 free", "45056  nothing", "(left alone)"}},
      {"@image.exe --machine @short",
       1,
       {"found there", "newer 4.1.8, ", "a.exe\" (deleted, and not written anew)\n"}},
      {"@image.exe --machine @stopped --json", 1, {"\"exitCode\": null,", "\"event\": \"\""}},
      {"@stub.exe", 1, {"-1000012", "Invalide or abscent install data", "Z:\\stub.exe"}},
      {"@image.exe --machine @linked --dir D:\\a", 1, {"-1000006"}},
      {"@linked/drive_c/Setup.exe --machine @linked --dir E:\\a --options=/rf:C:\\Setup.exe",
       0,
       {"added                      \"C:\\e\\a\\\"\n"}},
  };
  const std::map<std::string, std::string> before = ReadMachine(Host("")).files;
  for (const auto& [commandLine, status, said] : rows) {
    const ToolRun run = Run("plan " + std::string(commandLine));
    EXPECT_EQ(run.status, status) << commandLine << run.err;
    for (const char* text : said)
      EXPECT_NE(run.out.find(text), std::string::npos) << commandLine << ": " << text << '\n'
                                                       << run.out;
  }
  Write("bad/machine.ini", "[disk C]\nfree = lots\n");
  ExpectRefused(Run("plan @image.exe --machine @bad"), Host("bad/machine.ini:2").string());
  ExpectRefused(Run("plan @image.exe --machine @tmp"), "is no machine");
  ExpectRefused(Run("plan @image.exe --dir C:/apps"), "takes \"/d:C:/apps /s\" for something else");
  ExpectRefused(Run("plan @missing.exe"), "missing.exe");
  fs::remove_all(Host("bad"));
  EXPECT_EQ(ReadMachine(Host("")).files, before);
}

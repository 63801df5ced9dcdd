// What an install leaves for the product's removal, and a removal for the system's next start.
#include "registration/removal_program.h"

#include <algorithm>

#include "engine/install_pass.h"
#include "registration/uninstall_entries.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kProgram[] = "drive_c/windows/MorivRmv.exe";
const std::string kCurrentVersion = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\";

class RemovalProgram : public ProductTest {
 protected:
  RemovalProgram() {
    ImageBuilder image;
    image.header().reserved[7] = 7;
    image.Add("zebdial.exe", "%INSTALL_DIR%", "zebdial").Write(&pc);
    EXPECT_EQ(OpenPackage(&context), 1);
    EXPECT_EQ(InstallFiles(&context), 1);
  }
};

TEST_F(RemovalProgram, TellsItsPathWhereThatFitsAndKeepsTheRestOfTheHeader) {
  char path[24] = "old";
  EXPECT_EQ(WriteRemovalProgram(&context, path, 23), 1);
  EXPECT_STREQ(path, "old");
  EXPECT_EQ(WriteRemovalProgram(&context, path, 24), 1);
  EXPECT_STREQ(path, "C:\\windows\\MorivRmv.exe");
  const std::string program = pc.Read(kProgram);
  EXPECT_EQ(program[program.size() - 260 + 7], 7) << "in the reserved bytes at the end";
}

TEST_F(RemovalProgram, FailuresLeaveNoPartOfIt) {
  EXPECT_EQ(WriteRemovalProgram(nullptr, nullptr, 0), StatusBadArgument);
  const struct {
    std::vector<machine::Fault> faults;
    StatusCode status;
  } rows[] = {
      {{{.function = "GetFileVersionInfoSizeA"}}, StatusBadRecord},
      {{{.function = "WriteFile"}}, StatusWriteRemovalFailed},
      {{{.function = "WriteFile", .call = 2}}, StatusWriteRemovalFailed},
      {{{.function = "WriteFile", .call = 3}}, StatusWriteRemovalFailed},
      {{{.function = "ReadFile"}}, StatusWriteRemovalFailed},
      // Both ways of opening are refused: for the image, then for the copy.
      {{{.function = "CreateFileA"}, {.function = "_sopen"}}, StatusOpenFailed},
      {{{.function = "CreateFileA", .call = 2}, {.function = "_creat"}}, StatusCreateFileFailed}};
  for (const auto& [faults, status] : rows) {
    machine::SetFaults(faults);
    EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), status) << faults[0].function;
    EXPECT_FALSE(pc.Has(kProgram)) << faults[0].function;
  }
  FailNothing();
  Results results;
  for (int call = 1; call <= 8; ++call) {
    FailAllocation(call);
    results.push_back(WriteRemovalProgram(&context, nullptr, 0));
  }
  (void)WithdrawAllocationFailure();
  EXPECT_EQ(std::ranges::count(results, StatusNoMemory), 1);
}

using UninstallEntries = ProductTest;

TEST_F(UninstallEntries, AreStoredWithTheirNulAndFitOrAreLeftOut) {
  context.currentLanguage = kLanguageFrench;
  EXPECT_EQ(WriteUninstallEntry(&context), 1);
  EXPECT_EQ(GetRegistryBytes(kCurrentVersion + "Uninstall\\Moriv", "DisplayName"),
            std::string("ZEB Machine virtuelle Moriv", 28));
  EXPECT_EQ(GetRegistryBytes(kCurrentVersion + "Uninstall\\Moriv", "UninstallString"),
            std::string("C:\\windows\\MorivRmv.exe", 24));
  EXPECT_EQ(CancelRunOnceCommand(), 0) << "there is none";
  EXPECT_EQ(ScheduleFinalCleanup() + CancelRunOnceCommand(), 2);
  // Around the path the command has 79 characters of its 519.
  for (const size_t length : {size_t{440}, size_t{441}}) {
    EXPECT_EQ(WriteRunOnceCommand(std::string(length, 'p').c_str()), length == 440) << length;
    EXPECT_EQ(GetRegistryBytes(kCurrentVersion + "RunOnce", "MorivCommand").size(), 520u);
  }
  EXPECT_EQ(WriteRunOnceCommand("") + WriteRunOnceCommand(nullptr), 0);
  EXPECT_EQ(CancelRunOnceCommand(), 1);
  EXPECT_EQ(DeleteUninstallEntry(), 1);
  EXPECT_EQ(DeleteUninstallEntry(), 0);

  FailCall("LoadStringA", 2);  // the removal program's name
  EXPECT_EQ(WriteUninstallEntry(&context), 0);
  EXPECT_FALSE(HasRegistryKey(kCurrentVersion + "Uninstall\\Moriv"));
}

}  // namespace

#include "registration/removal_program.h"

#include "engine/install_pass.h"
#include "registration/cleanup_script.h"
#include "registration/uninstall_entries.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kProgram[] = "drive_c/windows/MorivRmv.exe";

class RemovalProgram : public ProductTest {
 protected:
  // Installs three files from an image whose executable has `size` bytes.
  void InstallFrom(size_t size) {
    ImageBuilder builder;
    builder.executable().resize(size);
    for (const char* name : {"zebdial.exe", "zebnet.dll", "zebddb.exe"}) {
      builder.Add(name, "%INSTALL_DIR%", name);
    }
    builder.header().reserved[7] = 7;
    builder.Write(&pc);
    ASSERT_EQ(OpenPackage(&context), 1);
    ASSERT_EQ(InstallFiles(&context), 1);
  }

  template <typename Record>
  Record ReadAt(size_t offset) const {
    Record record;
    const std::string bytes = pc.Read(kProgram);
    EXPECT_LE(offset + sizeof(record), bytes.size());
    std::memcpy(&record, bytes.data() + offset, sizeof(record));
    return record;
  }
};

TEST_F(RemovalProgram, IsTheExecutableTheRecordsAndAHeaderWithItsMark) {
  InstallFrom(172032);
  char path[64] = {};
  EXPECT_EQ(WriteRemovalProgram(&context, path, sizeof(path)), 1);
  EXPECT_STREQ(path, "C:\\windows\\MorivRmv.exe");
  const std::string program = pc.Read(kProgram);
  EXPECT_EQ(program.size(), 174688u);
  EXPECT_EQ(program.substr(0, 172032), pc.Read("drive_c/setup.exe").substr(0, 172032));
  for (size_t i = 0; i < 3; ++i) {
    const auto record = ReadAt<FileRecord>(172032 + i * sizeof(FileRecord));
    EXPECT_EQ(record.storedSize, 0u);
    EXPECT_GT(record.fileSize, 0u);
    EXPECT_STREQ(record.destination, "%INSTALL_DIR%");
  }
  const auto header = ReadAt<PackageHeader>(174688 - sizeof(PackageHeader));
  EXPECT_EQ(header.removalImageFlag, 1);
  EXPECT_EQ(header.packageLength, 3 * 696u);
  EXPECT_EQ(header.reserved[7], 7) << "passed on unchanged";
}

TEST_F(RemovalProgram, TakesExecutablesOfAnyLengthAndBuffersOfAny) {
  InstallFrom(4097);
  char path[24] = "old";
  for (const int32_t size : {0, 23}) {
    EXPECT_EQ(WriteRemovalProgram(&context, path, size), 1);
    EXPECT_STREQ(path, "old");
  }
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 260), 1);
  EXPECT_EQ(WriteRemovalProgram(&context, path, 24), 1);
  EXPECT_STREQ(path, "C:\\windows\\MorivRmv.exe");
  EXPECT_EQ(pc.Read(kProgram).size(), 4097u + 3 * 696 + 568);
}

TEST_F(RemovalProgram, FailuresLeaveNoPartOfIt) {
  InstallFrom(5000);
  EXPECT_EQ(WriteRemovalProgram(nullptr, nullptr, 0), StatusBadArgument);
  const std::pair<const char*, StatusCode> rows[] = {{"GetFileVersionInfoSizeA", StatusBadRecord},
                                                     {"WriteFile", StatusWriteRemovalFailed},
                                                     {"ReadFile", StatusWriteRemovalFailed}};
  for (const auto& [function, status] : rows) {
    FailAllCalls(function);
    EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), status) << function;
    EXPECT_FALSE(pc.Has(kProgram)) << function;
  }
  // The last write, that of the header.
  FailCall("WriteFile", 5 + 3 + 1);
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), StatusWriteRemovalFailed);
  EXPECT_FALSE(pc.Has(kProgram));
}

using CleanupScript = ProductTest;

TEST_F(CleanupScript, IsCutWhereAWriteFailsAndThenNothingIsScheduled) {
  FailCall("WriteFile", 3);
  EXPECT_EQ(ScheduleFinalCleanup(), 0);
  EXPECT_EQ(pc.Read("drive_c/windows/Moriv.INF"),
            "[Version]\r\nSignature=$Chicago$\r\nAdvancedINF=2.0\r\n");
  EXPECT_EQ(CancelRunOnceCommand(), 0) << "no command";
  FailNothing();
  EXPECT_EQ(ScheduleFinalCleanup(), 1);
  EXPECT_EQ(pc.Read("drive_c/windows/Moriv.INF").size(), 181u);
  EXPECT_EQ(CancelRunOnceCommand(), 1);
  EXPECT_EQ(WriteRunOnceCommand(""), 0);
  EXPECT_EQ(WriteRunOnceCommand(std::string(500, 'p').c_str()), 0) << "the command doesn't fit";
  EXPECT_EQ(CancelRunOnceCommand(), 0);
}

}  // namespace

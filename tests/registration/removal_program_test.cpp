// The trimmed copy of the image that removes the product.
#include "registration/removal_program.h"

#include "engine/install_pass.h"
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
};

TEST_F(RemovalProgram, IsTheExecutableOfAnyLengthTheRecordsAndAHeader) {
  InstallFrom(4097);
  char path[24] = "old";
  for (const int32_t size : {0, 23}) {
    EXPECT_EQ(WriteRemovalProgram(&context, path, size), 1);
    EXPECT_STREQ(path, "old");
  }
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 260), 1);
  EXPECT_EQ(WriteRemovalProgram(&context, path, 24), 1);
  EXPECT_STREQ(path, "C:\\windows\\MorivRmv.exe");
  const std::string program = pc.Read(kProgram);
  ASSERT_EQ(program.size(), 4097u + 3 * 696 + 568);
  PackageHeader header;
  std::memcpy(&header, program.data() + 4097 + 3 * 696, sizeof(header));
  EXPECT_EQ(header.packageLength, 3 * 696u);
  EXPECT_EQ(header.reserved[7], 7) << "passed on unchanged";
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
  // Both ways of opening are refused: for the image, then for the copy.
  machine::SetFaults({{.function = "CreateFileA"}, {.function = "_sopen"}});
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), StatusOpenFailed);
  machine::SetFaults({{.function = "CreateFileA", .call = 2}, {.function = "_creat"}});
  EXPECT_EQ(WriteRemovalProgram(&context, nullptr, 0), StatusCreateFileFailed);
  EXPECT_FALSE(pc.Has(kProgram));
}

}  // namespace

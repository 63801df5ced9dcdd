// The package at the tail of the program's own image.
#include "package/package_reader.h"

#include <climits>
#include <string>

#include "tests/support/allocation_faults.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

using Strings = std::vector<std::string>;

class PackageReader : public ProductTest {
 protected:
  // Opens an image of these bytes and leaves it open.
  StatusCode Open(const std::string& bytes) {
    EXPECT_EQ(CloseSetup(&context), 1);
    pc.Write("drive_c/setup.exe", bytes);
    pc.Restart("drive_c/setup.exe");
    const StatusCode status = OpenPackage(&context);
    EXPECT_EQ(context.packageFile != nullptr, status == StatusOk);
    return status;
  }
};

TEST_F(PackageReader, AHeaderAloneIsAnImageAndEachByteOfSizeAndMagicCounts) {
  ImageBuilder builder;
  builder.executable().clear();
  builder.header().spaceNeeded = 77;
  const std::string header = builder.Bytes();
  ASSERT_EQ(header.size(), 568u);
  EXPECT_EQ(Open(header), StatusOk);
  EXPECT_EQ(context.header.spaceNeeded, 77u);
  EXPECT_EQ(Open(header.substr(1)), StatusBadPackage);
  EXPECT_EQ(Events(), Strings{"7/2 C:\\setup.exe"}) << "no room for a header: the seek fails";
  for (size_t offset = 0; offset < offsetof(PackageHeader, recordCount); ++offset) {
    std::string damaged = header;
    damaged[offset] = static_cast<char>(damaged[offset] ^ 0x20);
    EXPECT_EQ(Open(damaged), StatusBadPackage) << "byte " << offset;
    EXPECT_EQ(Events(), Strings{"9/2 C:\\setup.exe"}) << "byte " << offset;
  }
  // Nothing behind them does.
  EXPECT_EQ(Open(header.substr(0, 28) + std::string(540, '\xFF')), StatusOk);
}

TEST_F(PackageReader, AnImageOf2GibAndAHeaderIsTooLong) {
  EXPECT_EQ(Open("MZ"), StatusBadPackage);
  for (const uintmax_t size : {uintmax_t{INT32_MAX} + 568, uintmax_t{INT32_MAX} + 569}) {
    std::filesystem::resize_file(pc.Host("drive_c/setup.exe"), size);
    EXPECT_EQ(ReadPackageHeader(&context), StatusBadPackage);
  }
  // The longer one can't even be positioned in.
  EXPECT_EQ(Events(), (Strings{"7/2 C:\\setup.exe", "9/2 C:\\setup.exe", "7/2 C:\\setup.exe"}));
}

TEST_F(PackageReader, WithoutMemoryOrArgumentsThereIsNoPackageAndNoEvent) {
  ImageBuilder().Write(&pc);
  FailAllocation(1);
  EXPECT_EQ(OpenPackage(&context), StatusNoMemory);
  EXPECT_EQ(context.packageFile, nullptr);
  EXPECT_EQ(Events(), Strings{});
  EXPECT_EQ(OpenPackage(nullptr), StatusBadPackage);
  EXPECT_EQ(ReadPackageHeader(nullptr), StatusBadPackage);
  constexpr uint32_t kNeeded = sizeof("C:\\setup.exe");
  char path[kNeeded] = {};
  FileRecord record = {};
  for (const StatusCode status :
       {ReadFileRecord(nullptr, &record), ReleasePackage(nullptr), CloseSetup(nullptr),
        GetImagePath(path, 0), GetImagePath(nullptr, kNeeded)}) {
    EXPECT_EQ(status, StatusBadArgument);
  }
  EXPECT_EQ(GetImagePath(path, kNeeded), StatusOk);
  EXPECT_STREQ(path, "C:\\setup.exe");
  EXPECT_EQ(GetImagePath(path, kNeeded - 1), StatusNoModulePath) << "a cut path names another file";
  EXPECT_STREQ(path, "");
}

}  // namespace

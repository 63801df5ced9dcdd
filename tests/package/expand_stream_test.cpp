// From a stream in the package to a file.
#include "package/expand_stream.h"

#include "tests/support/allocation_faults.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kTarget[] = "C:\\out.bin";

using ExpandStreamTest = ProductTest;

TEST_F(ExpandStreamTest, EveryAllocationThatFailsLeavesNoFile) {
  // The output, its name, the expander, the expander's table.
  const StatusCode statuses[] = {StatusNoMemory, StatusCreateFileFailed, StatusNoMemory,
                                 StatusNoMemory};
  pc.Write("drive_c/package.bin", PackStream("abc"));
  for (int call = 1; call <= 5; ++call) {
    DataFile package("C:\\package.bin");
    ASSERT_EQ(package.OpenForRead(), 1);
    FailAllocation(call);
    const StatusCode status = ExpandStream(&package, kTarget, 4);
    const bool ranOut = !WithdrawAllocationFailure();
    EXPECT_EQ(ranOut, call <= 4);
    EXPECT_EQ(status, ranOut ? statuses[call - 1] : StatusOk) << call;
    EXPECT_EQ(pc.Has("drive_c/out.bin"), !ranOut) << call;
  }
}

TEST_F(ExpandStreamTest, WhatIsMissingMakesNoFile) {
  pc.Write("drive_c/package.bin", "PKZ");
  DataFile package("C:\\package.bin");
  ASSERT_EQ(package.OpenForRead(), 1);
  EXPECT_EQ(ExpandStream(nullptr, kTarget, 4), StatusInternal);
  EXPECT_EQ(ExpandStream(&package, nullptr, 4), StatusInternal);
  EXPECT_EQ(ExpandStream(&package, "", 4), StatusInternal);
  EXPECT_EQ(ExpandStream(&package, kTarget, 0), StatusInternal);
  EXPECT_FALSE(pc.Has("drive_c/out.bin"));
  EXPECT_EQ(ExpandStream(&package, "C:\\missing\\out.bin", 4), StatusCreateFileFailed);
  EXPECT_EQ(package.Tell(), 0);
}

}  // namespace

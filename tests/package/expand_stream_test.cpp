// From a stream in the package to a file.
#include "package/expand_stream.h"

#include <string>

#include "tests/support/allocation_faults.h"
#include "tests/support/code_stream.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr char kTarget[] = "C:\\out.bin";

class ExpandStreamTest : public ProductTest {
 protected:
  StatusCode Expand(const std::string& stream) {
    pc.Write("drive_c/package.bin", stream);
    DataFile package("C:\\package.bin");
    EXPECT_EQ(package.OpenForRead(), 1);
    return ExpandStream(&package, kTarget, static_cast<uint32_t>(stream.size()));
  }

  bool HasTarget() const { return pc.Has("drive_c/out.bin"); }
};

TEST_F(ExpandStreamTest, ABadStreamLeavesNoFile) {
  pc.Write("drive_c/out.bin", "an older file");
  // The code without a meaning is in the second block; by then the first kilobyte is written.
  EXPECT_EQ(Expand(CodeStream().PutTimes('x', 1500).Put(256).PutTimes('x', 500).Stream()),
            StatusExpandFailed);
  EXPECT_FALSE(HasTarget());
}

TEST_F(ExpandStreamTest, AStopLeavesNoFile) {
  wizardState.cancelRequested = 1;
  EXPECT_EQ(Expand(PackStream("abc")), StatusCancelled);
  EXPECT_FALSE(HasTarget());
  wizardState.cancelRequested = 2;  // the answer that counts is 1
  EXPECT_EQ(Expand(PackStream("abc")), StatusOk);
}

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
    EXPECT_EQ(HasTarget(), !ranOut) << call;
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
  EXPECT_FALSE(HasTarget());
  EXPECT_EQ(ExpandStream(&package, "C:\\missing\\out.bin", 4), StatusCreateFileFailed);
  EXPECT_EQ(package.Tell(), 0);
}

}  // namespace

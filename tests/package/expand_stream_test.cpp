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
  // Expands a stream of `storedSize` bytes, all of them unless told.
  StatusCode Expand(const std::string& stream, uint32_t storedSize = 0) {
    pc.Write("drive_c/package.bin", stream);
    DataFile package("C:\\package.bin");
    EXPECT_EQ(package.OpenForRead(), 1);
    const StatusCode status = ExpandStream(
        &package, kTarget, storedSize != 0 ? storedSize : static_cast<uint32_t>(stream.size()));
    position_ = package.Tell();
    return status;
  }

  bool HasTarget() const { return pc.Has("drive_c/out.bin"); }
  std::string Target() const { return pc.Read("drive_c/out.bin"); }

  int32_t position_ = 0;  // of the package, behind the expansion
};

TEST_F(ExpandStreamTest, TakesItsStreamAndNoByteMore) {
  std::string file;
  for (int i = 0; i < 30000; ++i) file += static_cast<char>(i * i / 7);
  const std::string stream = PackStream(file);
  ASSERT_GT(stream.size(), 4096u);
  ASSERT_EQ(Expand(stream + "the next record", static_cast<uint32_t>(stream.size())), StatusOk);
  EXPECT_TRUE(Target() == file);
  EXPECT_EQ(position_, static_cast<int32_t>(stream.size()));
}

TEST_F(ExpandStreamTest, AStreamThatEndsEarlyIsNoFailure) {
  EXPECT_EQ(Expand(std::string("PKZ\0", 4)), StatusOk);
  EXPECT_TRUE(HasTarget());
  EXPECT_EQ(Target(), "");
  EXPECT_EQ(Expand(PackStream("abcdef").substr(0, 8)), StatusOk);
  EXPECT_EQ(Target(), "abcd");
}

TEST_F(ExpandStreamTest, ABadStreamLeavesNoFile) {
  pc.Write("drive_c/out.bin", "an older file");
  EXPECT_EQ(Expand("PKZ"), StatusExpandFailed);
  EXPECT_FALSE(HasTarget());
  // The code without a meaning is in the second block; by then the first kilobyte is written.
  const std::string late = CodeStream().PutTimes('x', 1500).Put(256).PutTimes('x', 500).Stream();
  EXPECT_EQ(Expand(late), StatusExpandFailed);
  EXPECT_FALSE(HasTarget());
}

TEST_F(ExpandStreamTest, APackageThatEndsWithinTheStreamLeavesNoFile) {
  const std::string stream = CodeStream().PutTimes('x', 2000).Stream();
  EXPECT_EQ(Expand(stream, static_cast<uint32_t>(stream.size()) + 1), StatusReadFailed);
  EXPECT_FALSE(HasTarget());
  EXPECT_EQ(Expand(stream, 0xFFFFFFFF), StatusReadFailed);
  EXPECT_FALSE(HasTarget());
}

TEST_F(ExpandStreamTest, AStopLeavesNoFile) {
  wizardState.cancelRequested = 1;
  EXPECT_EQ(Expand(PackStream("abc")), StatusCancelled);
  EXPECT_FALSE(HasTarget());
  EXPECT_EQ(position_, 0);
  wizardState.cancelRequested = 2;  // the answer that counts is 1
  EXPECT_EQ(Expand(PackStream("abc")), StatusOk);
}

TEST_F(ExpandStreamTest, EveryWriteThatFailsLeavesNoFile) {
  const std::string stream = CodeStream().PutTimes('x', 2500).Stream();
  for (int call = 1; call <= 3; ++call) {
    FailCall("WriteFile", call);
    EXPECT_EQ(Expand(stream), StatusExpandFailed) << call;
    EXPECT_FALSE(HasTarget()) << call;
  }
  FailCall("WriteFile", 4);
  EXPECT_EQ(Expand(stream), StatusOk);
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

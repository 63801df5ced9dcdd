// The one file class, through a handle and through a descriptor.
#include "package/data_file.h"

#include <climits>
#include <string>

#include "tests/support/allocation_faults.h"
#include "tests/support/product_test.h"

namespace {

constexpr char kName[] = "C:\\a.bin";
constexpr char kHostName[] = "drive_c/a.bin";

std::string Read(DataFile& file, uint32_t count) {
  std::string bytes(count, '?');
  bytes.resize(file.Read(bytes.data(), count));
  return bytes;
}

bool Write(DataFile& file, const std::string& bytes) {
  return file.Write(bytes.data(), static_cast<uint32_t>(bytes.size())) == bytes.size();
}

// What holds whichever way a file is open.
class DataFileByEitherWay : public ProductTest, public testing::WithParamInterface<bool> {
 protected:
  DataFileByEitherWay() {
    if (GetParam()) FailAllCalls("CreateFileA");
  }

  DataFile file{kName};
};

INSTANTIATE_TEST_SUITE_P(Ways, DataFileByEitherWay, testing::Bool(), [](const auto& way) {
  return std::string(way.param ? "Descriptor" : "Handle");
});

TEST_P(DataFileByEitherWay, BytesPassUnchangedAndOnlyCreateMakesAFileOrCutsOne) {
  EXPECT_EQ(file.OpenForRead() + file.OpenForWrite(), 0);
  EXPECT_FALSE(pc.Has(kHostName));
  std::string bytes = "\n\r\n\x1A";
  for (int byte = 0; byte < 256; ++byte) bytes += static_cast<char>(byte);
  ASSERT_EQ(file.Create(), 1);
  EXPECT_TRUE(Write(file, bytes));
  EXPECT_EQ(file.Tell(), static_cast<int32_t>(bytes.size()));
  EXPECT_EQ(file.SeekTo(0), 1);
  EXPECT_EQ(Read(file, 1000), bytes) << "a file made can be read too";
  EXPECT_EQ(Read(file, 1000), "") << "at its end";
  EXPECT_EQ(file.Close(), 1);
  EXPECT_EQ(pc.Read(kHostName), bytes);

  ASSERT_EQ(file.OpenForWrite(), 1);
  EXPECT_EQ(Read(file, 1), "") << "open for writing alone";
  EXPECT_EQ(file.SeekToEnd(), 1);
  EXPECT_TRUE(Write(file, "er"));
  EXPECT_EQ(file.Close(), 1);
  EXPECT_EQ(pc.Read(kHostName), bytes + "er");
  ASSERT_EQ(file.Create(), 1);
  EXPECT_EQ(file.GetSize(), 0u);
}

TEST_P(DataFileByEitherWay, PositionsStayWhereASeekOrAnOpenIsRefused) {
  pc.Write(kHostName, "0123456789");
  ASSERT_EQ(file.OpenForRead(), 1);
  EXPECT_FALSE(Write(file, "x")) << "open for reading alone";
  EXPECT_EQ(Read(file, 0), "");
  EXPECT_EQ(file.Read(nullptr, 4), 0u);
  EXPECT_EQ(file.SeekTo(7), 1);
  EXPECT_EQ(file.Create() + file.OpenForWrite() + file.OpenForRead(), 0) << "it is open";
  EXPECT_EQ(file.SeekTo(-1) + file.SeekTo(INT32_MIN), 0);
  EXPECT_EQ(file.Tell(), 7);
  EXPECT_EQ(file.GetSize(), 10u);
  EXPECT_EQ(file.SeekTo(INT32_MAX), 1) << "beyond the end";
  EXPECT_EQ(file.Tell(), INT32_MAX);
}

TEST_P(DataFileByEitherWay, AFileMadeCanBeWrittenAgainAndDeletedWhileOpen) {
  ASSERT_EQ(file.Create(), 1);
  EXPECT_EQ(file.Write(nullptr, 4) + file.Write("x", 0), 0u);
  FailCall(GetParam() ? "_close" : "CloseHandle");
  EXPECT_EQ(file.Close(), 0) << "the system's verdict; it is closed anyway";
  EXPECT_EQ(file.Tell(), -1);
  FailNothing();  // whichever way made it, the plain one opens it
  ASSERT_EQ(file.OpenForWrite(), 1);
  EXPECT_EQ(file.Delete(), 1);
  EXPECT_FALSE(pc.Has(kHostName));
  EXPECT_EQ(file.Delete(), 0);
}

using DataFileTest = ProductTest;

TEST_F(DataFileTest, AClosedOneKnowsItsSizeAndANamelessOneNothing) {
  pc.Write(kHostName, "text");
  FailAllocation(1);
  DataFile withoutMemory(kName);
  DataFile closed(kName);
  DataFile empty("");
  DataFile none(nullptr);
  for (DataFile* file : {&withoutMemory, &closed, &empty, &none}) {
    EXPECT_EQ(Read(*file, 4), "");
    EXPECT_FALSE(Write(*file, "x"));
    EXPECT_EQ(file->SeekTo(0) + file->SeekToEnd(), 0);
    EXPECT_EQ(file->Tell(), -1);
    EXPECT_EQ(file->GetSize(), file == &closed ? 4u : 0u);
    if (file == &closed) continue;
    EXPECT_EQ(file->OpenForRead() + file->OpenForWrite() + file->Create() + file->Delete(), 0);
    EXPECT_EQ(file->GetName(), nullptr);
  }
}

TEST_F(DataFileTest, TheFirstWayExcludesAndTheSecondShares) {
  pc.Write(kHostName, "text");
  DataFile first(kName);
  DataFile second(kName);
  ASSERT_EQ(first.OpenForRead(), 1);
  EXPECT_EQ(second.OpenForRead(), 0);
  EXPECT_EQ(first.Close(), 1);
  FailAllCalls("CreateFileA");
  ASSERT_EQ(first.OpenForRead(), 1);
  ASSERT_EQ(second.OpenForRead(), 1);
  EXPECT_EQ(Read(first, 4) + Read(second, 4), "texttext");
}

TEST_F(DataFileTest, FailuresOfTheSystemAreCountsOfNothing) {
  pc.Write(kHostName, "text");
  DataFile file(kName);
  for (const char* openFault : {"none", "CreateFileA"}) {
    FailAllCalls(openFault);
    ASSERT_EQ(file.OpenForRead(), 1);
    machine::SetFaults({{.function = "ReadFile"},
                        {.function = "_read"},
                        {.function = "GetFileSize"},
                        {.function = "_tell"},
                        {.function = "SetFilePointer", .fromThenOn = true},
                        {.function = "_lseek", .fromThenOn = true}});
    EXPECT_EQ(Read(file, 4), "");
    EXPECT_EQ(file.GetSize(), 0u);
    EXPECT_EQ(file.SeekTo(1) + file.SeekToEnd(), 0);
    EXPECT_EQ(file.Tell(), -1);
    EXPECT_EQ(file.Close(), 1);
  }
  FailAllCalls("CreateFileA");
  EXPECT_EQ(DataFile("C:\\windows").Create(), 0);
  EXPECT_EQ(machine::CallCount("_chmod"), 0) << "what can't be made keeps its attributes";
  machine::SetFaults({{.function = "CreateFileA"}, {.function = "_setmode"}});
  EXPECT_EQ(file.Create(), 0);
  EXPECT_FALSE(pc.Has(kHostName)) << "a file in text mode is none";
}

}  // namespace

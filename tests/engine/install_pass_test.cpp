// What the install pass does at its edges.
#include "engine/install_pass.h"

#include "engine/resolver.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

using Strings = std::vector<std::string>;

class InstallPass : public ProductTest {
 protected:
  InstallPass() {
    ImageBuilder().Add("a.dll", "%INSTALL_DIR%;%SYS_DIR%\\sub", "aaaa").Write(&pc);
    EXPECT_EQ(OpenPackage(&context), 1);
  }
};

TEST_F(InstallPass, WithoutMemoryForTheRecordsThePackageIsClosed) {
  FailAllocation(1);
  EXPECT_EQ(InstallFiles(&context), StatusNoMemory);
  EXPECT_EQ(Events(), Strings{"3/2"});
  EXPECT_EQ(context.packageFile, nullptr);
  EXPECT_EQ(InstallFiles(&context), StatusInternal);
  EXPECT_EQ(InstallFiles(nullptr), StatusInternal);
}

TEST_F(InstallPass, WithoutMemoryForATargetTheRecordIsUnresolved) {
  FailAllocation(3);  // the records, the first target, the second
  EXPECT_EQ(InstallFiles(&context), StatusNoMemory);
  EXPECT_EQ(Events(), Strings{"5/2 %INSTALL_DIR%;%SYS_DIR%\\suba.dll"});
  EXPECT_FALSE(pc.Has("drive_c/Moriv"));
}

TEST_F(InstallPass, TargetsNeedAPackageAListAndASize) {
  TargetList list = {};
  EXPECT_EQ(InstallTargets(&context, nullptr, 8), StatusInternal);
  EXPECT_EQ(InstallTargets(&context, &list, 8), StatusInternal);
  ASSERT_EQ(AddTarget(&list, "abc", nullptr), 1);
  EXPECT_EQ(InstallTargets(nullptr, &list, 8), StatusInternal);
  EXPECT_EQ(InstallTargets(&context, &list, 0), StatusInternal);
  EXPECT_EQ(Events(), Strings{});
  EXPECT_EQ(InstallTargets(&context, &list, 8), StatusInternal) << "too short for a path";
  EXPECT_EQ(Events(), Strings{"28/2 abc"});
  FreeTargets(&list);
}

TEST_F(InstallPass, TargetsAreAddedWholeOrNotAtAllToAListThatBeginsAnew) {
  TargetList list = {};
  EXPECT_EQ(AddTarget(&list, std::string(259, 'p').c_str(), std::string(259, 'd').c_str()), 1);
  EXPECT_EQ(AddTarget(&list, "second", nullptr), 1);
  EXPECT_EQ(
      (Results{AddTarget(&list, std::string(260, 'p').c_str(), nullptr),
               AddTarget(&list, "p", std::string(260, 'd').c_str()), AddTarget(&list, nullptr, "d"),
               AddTarget(nullptr, "p", "d")}),
      (Results{StatusBufferTooSmall, StatusBufferTooSmall, StatusBadArgument, StatusBadArgument}));
  FailAllocation(1);
  EXPECT_EQ(AddTarget(&list, "p", "d"), StatusNoMemory);
  ASSERT_EQ(list.count, 2);
  EXPECT_EQ(list.entries[0].path, std::string(259, 'p'));
  EXPECT_EQ(list.entries[0].directory, std::string(259, 'd'));
  EXPECT_STREQ(list.entries[1].path, "second");
  EXPECT_STREQ(list.entries[1].directory, "");

  TargetList resolved = list;
  FileRecord record = {};
  (void)CopyText(record.destination, "C:\\x");
  EXPECT_EQ(ResolveTargets(&context, &resolved, "C:\\Moriv", &record, false), 1);
  EXPECT_EQ(resolved.count, 1);
  for (TargetList* each : {&list, &resolved}) FreeTargets(each);
  EXPECT_EQ(list.count, 0);
}

TEST_F(InstallPass, DirectoriesAreMadeWhereAPathFitsAndTheDriveIsThere) {
  EXPECT_EQ((Results{MakeDirectories("C:\\"), MakeDirectories(nullptr), CopyTarget("", "C:\\x"),
                     CopyTarget("C:\\x", "")}),
            Results(4, StatusInternal));
  EXPECT_EQ(MakeDirectories("C:\\a"), StatusOk);
  EXPECT_EQ(MakeDirectories("Q:\\a\\b"), StatusCreateDirFailed);
  for (const size_t length : {size_t{259}, size_t{260}, size_t{5000}}) {
    const std::string path = std::string(length, 'd') + "\\f";
    EXPECT_EQ(MakeDirectories(path.c_str()), StatusCreateDirFailed) << length;
  }
  EXPECT_EQ(CopyTarget("C:\\absent", "C:\\x"), StatusCopyFailed);
}

}  // namespace

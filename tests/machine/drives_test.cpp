// Where paths lead: the rules of names and drives.
#include "machine/drives.h"

#include <gtest/gtest.h>

#include "tests/support/test_machine.h"

namespace fs = std::filesystem;
using machine::Locate;

namespace {

// What names lead to anywhere is in tests/contract/.
TEST(Drives, NamesFindTheirFilesAsTheHostSpellsThem) {
  TestMachine pc;
  pc.Write("drive_c/Dir/Read Me.TXT", "x");
  pc.Write("drive_c/both", "lower");
  pc.Write("drive_c/BOTH", "upper");
  pc.Write("drive_c/caf\xC3\xA9", "x");
  pc.Write("drive_d/file", "x");
  struct {
    const char* path;
    const char* host;  // in the machine's folder
    bool exists;
  } const rows[] = {
      {"c:/dIR\\READ me.txt", "drive_c/Dir/Read Me.TXT", true},
      {"C:\\both", "drive_c/both", true},
      {"C:\\BOTH", "drive_c/BOTH", true},
      {"C:\\Both", "drive_c/BOTH", true},
      {"C:\\CAF\xC9", "drive_c/caf\xC3\xA9", true},
      {"C:\\na\xEFve", "drive_c/na\xC3\xAFve", false},
      {"C:\\DIR\\New Name", "drive_c/Dir/New Name", false},
      {"D:file", "drive_d/file", true},
      {"D:\\..\\drive_c\\both", "drive_d/drive_c/both", false},
  };
  for (const auto& row : rows) {
    const auto location = Locate(row.path);
    ASSERT_TRUE(location.has_value()) << row.path;
    EXPECT_EQ(location->host, pc.Host(row.host)) << row.path;
    EXPECT_EQ(location->exists, row.exists) << row.path;
  }
  EXPECT_FALSE(Locate("C:\\none\\New Name")->parentExists);
  EXPECT_TRUE(Locate("C:\\new")->parentExists);
}

TEST(Drives, HostsFilesOfImpossibleNamesAreOutOfReach) {
  TestMachine pc;
  pc.Write("drive_c/NUL", "x");
  pc.Write("drive_c/what?", "x");
  for (const char* path : {"C:\\NUL", "C:\\what?", "C:\\a:b", "ab:c", "C:\\prn\\x", "//server/x"})
    EXPECT_FALSE(Locate(path).has_value()) << path;
}

TEST(Drives, ChangesInAFolderAreSeenWhoeverMakesThem) {
  const auto exists = [](const char* path) { return Locate(path)->exists; };
  for (const int others : {0, 300}) {  // a small folder and a large one
    SCOPED_TRACE(others);
    TestMachine pc;
    for (int i = 0; i < others; ++i) pc.Write("drive_c/dir/" + std::to_string(i), "x");
    pc.Write("drive_c/dir/One", "x");
    EXPECT_TRUE(exists("C:\\DIR\\ONE"));
    EXPECT_FALSE(exists("C:\\DIR\\TWO"));
    pc.Write("drive_c/dir/Two", "x");
    EXPECT_TRUE(exists("C:\\DIR\\TWO"));
    fs::rename(pc.Host("drive_c/dir/Two"), pc.Host("drive_c/dir/Three"));
    EXPECT_FALSE(exists("C:\\DIR\\TWO"));
    EXPECT_TRUE(exists("C:\\DIR\\THREE"));
    // Another folder under the same path: moved there, or made anew.
    fs::rename(pc.Host("drive_c/dir"), pc.Host("drive_c/old"));
    pc.Write("drive_c/dir/Four", "x");
    EXPECT_FALSE(exists("C:\\DIR\\ONE"));
    EXPECT_TRUE(exists("C:\\DIR\\FOUR"));
    EXPECT_TRUE(exists("C:\\OLD\\ONE"));
    fs::remove_all(pc.Host("drive_c/old"));
    pc.Write("drive_c/old/Five", "x");
    EXPECT_FALSE(exists("C:\\OLD\\ONE"));
    EXPECT_TRUE(exists("C:\\OLD\\FIVE"));
  }
}

TEST(Drives, LinksAreFollowedInsideTheMachineOnly) {
  TestMachine pc;
  pc.Write("drive_c/dir/file", "x");
  const TemporaryFolder outside;
  std::ofstream(outside.Path() / "file") << "x";
  fs::create_directory_symlink(pc.Host("drive_c/dir"), pc.Host("drive_c/inside"));
  fs::create_directory_symlink(outside.Path(), pc.Host("drive_c/outside"));
  fs::create_symlink(outside.Path() / "file", pc.Host("drive_c/outer file"));
  fs::create_symlink("nothing", pc.Host("drive_c/dangling"));
  fs::create_directory_symlink(outside.Path(), pc.Host("drive_e"));
  EXPECT_TRUE(Locate("C:\\inside\\file")->exists);
  for (const char* path : {"C:\\outside", "C:\\outside\\file", "C:\\outside\\new", "C:\\outer file",
                           "C:\\dangling", "E:\\file"}) {
    EXPECT_FALSE(Locate(path).has_value()) << path;
  }
}

}  // namespace

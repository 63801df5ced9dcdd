// Where paths lead on the host, and what the machine's settings and its image change of the file
// functions. What these do anywhere is in tests/contract/.
#include "machine/drives.h"

#include <gtest/gtest.h>

#include "platform/win32.h"
#include "tests/support/test_machine.h"

namespace fs = std::filesystem;
using machine::Locate;

namespace {

HANDLE Open(const char* name, DWORD access = GENERIC_READ, DWORD share = 0) {
  return CreateFileA(name, access, share, nullptr, OPEN_EXISTING, 0, nullptr);
}

// Whether the open works; what it opened is closed again.
bool Opens(HANDLE handle) {
  return handle != INVALID_HANDLE_VALUE && CloseHandle(handle);
}

// At the position, from the file's start.
bool Write(HANDLE handle, LONG position, const std::string& bytes) {
  DWORD done = 99;
  SetFilePointer(handle, position, nullptr, FILE_BEGIN);
  return WriteFile(handle, bytes.data(), static_cast<DWORD>(bytes.size()), &done, nullptr);
}

// The answers of calls, made from left to right: y or n.
std::string Told(std::initializer_list<int> answers) {
  std::string told;
  for (const int answer : answers) told += answer != 0 ? 'y' : 'n';
  return told;
}

TEST(Drives, NamesFindTheirFilesAsTheHostSpellsThem) {
  TestMachine pc;
  for (const char* file : {"drive_c/Dir/Read Me.TXT", "drive_c/both", "drive_c/BOTH", "drive_c/NUL",
                           "drive_c/caf\xC3\xA9", "drive_d/file", "drive_c/what?"}) {
    pc.Write(file, "x");
  }
  // The host's path in the machine's folder is null where the path leads out of reach.
  const std::tuple<const char*, const char*, bool> rows[] = {
      {"c:/dIR\\READ me.txt", "drive_c/Dir/Read Me.TXT", true},
      {"C:\\both", "drive_c/both", true},
      {"C:\\BOTH", "drive_c/BOTH", true},
      {"C:\\Both", "drive_c/BOTH", true},
      {"C:\\CAF\xC9", "drive_c/caf\xC3\xA9", true},
      {"C:\\na\xEFve", "drive_c/na\xC3\xAFve", false},
      {"C:\\DIR\\New Name", "drive_c/Dir/New Name", false},
      {"D:file", "drive_d/file", true},
      {"D:\\..\\drive_c\\both", "drive_d/drive_c/both", false},
      {"C:\\NUL", nullptr, false},
      {"C:\\what?", nullptr, false},
      {"ab:c", nullptr, false},
  };
  for (const auto& [path, host, exists] : rows) {
    const auto location = Locate(path);
    ASSERT_EQ(location.has_value(), host != nullptr) << path;
    if (host == nullptr) continue;
    EXPECT_EQ(location->host, pc.Host(host)) << path;
    EXPECT_EQ(location->exists, exists) << path;
  }
}

TEST(Drives, ChangesInAFolderAreSeenWhoeverMakesThem) {
  const auto seen = [] {
    std::string names;
    for (const std::string name : {"dir\\one", "dir\\two", "dir\\three", "old\\one", "old\\two"}) {
      if (Locate("C:\\" + name)->exists) names += name + ' ';
    }
    return names;
  };
  for (const int others : {0, 300}) {  // a small folder and a large one
    SCOPED_TRACE(others);
    TestMachine pc;
    for (int i = 0; i < others; ++i) pc.Write("drive_c/dir/" + std::to_string(i), "x");
    pc.Write("drive_c/dir/One", "x");
    EXPECT_EQ(seen(), "dir\\one ");
    pc.Write("drive_c/dir/Two", "x");
    EXPECT_EQ(seen(), "dir\\one dir\\two ");
    fs::rename(pc.Host("drive_c/dir/Two"), pc.Host("drive_c/dir/Three"));
    EXPECT_EQ(seen(), "dir\\one dir\\three ");
    // Another folder under the same path: moved there, or made anew.
    fs::rename(pc.Host("drive_c/dir"), pc.Host("drive_c/old"));
    pc.Write("drive_c/dir/Two", "x");
    EXPECT_EQ(seen(), "dir\\two old\\one ");
    fs::remove_all(pc.Host("drive_c/old"));
    pc.Write("drive_c/old/Two", "x");
    EXPECT_EQ(seen(), "dir\\two old\\two ");
  }
}

TEST(Drives, LinksAreFollowedInsideTheMachineOnly) {
  TestMachine pc;
  pc.Write("drive_c/dir/file", "x");
  const TemporaryFolder outside;
  outside.Write("file", "x");
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

TEST(Drives, NoFileOutsideIsWrittenUnderASecondName) {
  TestMachine pc;
  pc.Write("drive_c/own", "own");
  const TemporaryFolder outside;
  outside.Write("file", "kept");
  fs::create_hard_link(outside.Host("file"), pc.Host("drive_c/file"));
  fs::create_symlink(outside.Host("file"), pc.Host("registry.reg.new"));
  const char* const file = "C:\\file";
  EXPECT_EQ(Told({Opens(Open(file)), CopyFileA(file, "C:\\copy", FALSE),
                  Opens(Open(file, GENERIC_WRITE)), Opens(Create(file)),
                  CopyFileA("C:\\own", file, FALSE), _creat(file, _S_IREAD | _S_IWRITE) >= 0,
                  _sopen(file, _O_WRONLY | _O_BINARY, _SH_DENYNO) >= 0, _chmod(file, _S_IREAD) == 0,
                  DeleteFileA(file), pc.Has("drive_c/file")}),
            "yynnnnnnyn");
  // The registry is written too.
  HKEY key = nullptr;
  EXPECT_EQ(
      RegCreateKeyExA(HKEY_LOCAL_MACHINE, "New", 0, nullptr, 0, KEY_READ, nullptr, &key, nullptr),
      0);
  RegCloseKey(key);
  EXPECT_NE(pc.Read("registry.reg").find("New]"), std::string::npos);
  EXPECT_EQ(outside.Read("file"), "kept");
  EXPECT_EQ(machine::Stop(), "");
}

TEST(Disks, FullOneTakesAWriteWholeOrNotAtAll) {
  TestMachine pc("[disk c]\nwritable = 10\n");
  const auto room = [] { return *machine::CurrentSettings().disks['C'].writable; };
  HANDLE file = Create("C:\\a");
  // Two bytes more fit, and ten over what is there.
  EXPECT_EQ(Told({Write(file, 0, "12345678"), Write(file, 8, "abc"),
                  GetFileSize(file, nullptr) == 8, Write(file, 6, "7890"), Write(file, 10, "!"),
                  Write(file, 0, "1234567890"), DeleteFileA("C:\\a"), CloseHandle(file),
                  CopyFileA("C:\\a", "C:\\b", FALSE), pc.Has("drive_c/b")}),
            "ynyynynynn");
  EXPECT_TRUE(Opens(Create("C:\\a")));  // cut: ten bytes again
  EXPECT_EQ(room(), 10u);
  file = Create("C:\\b");
  EXPECT_EQ(Told({Write(file, 0, "123456789"), Write(file, 10, "z"), CloseHandle(file),
                  DeleteFileA("C:\\b")}),
            "ynyy");  // the gap counts too
  EXPECT_EQ(room(), 10u);
  const int text = _creat("C:\\text", _S_IREAD | _S_IWRITE);
  for (int number = 0; number < 64; ++number)
    EXPECT_FALSE(number != text && _close(number) == 0);  // of a handle, or nothing
  EXPECT_EQ(_write(text, "123\n567\n9", 9), -1);          // eleven bytes in text mode
  EXPECT_EQ(_write(text, "123\n5678\n", 9), -1);
  EXPECT_EQ(_write(text, "123\n56789", 9), 9);
  EXPECT_EQ(_close(text), 0);
}

TEST(Disks, ReadOnlyOneRefusesEveryChange) {
  TestMachine pc("[disk D]\nreadonly = 1\n");
  pc.Write("drive_d/dir/file", "x");
  for (const char* folder : {"drive_d/empty", "drive_e"}) fs::create_directory(pc.Host(folder));
  const char* const file = "D:\\dir\\file";
  // The root of a disk stays, empty or not.
  EXPECT_EQ(
      Told({Opens(Open(file)), CopyFileA(file, "C:\\copy", FALSE), Opens(Open(file, GENERIC_WRITE)),
            Opens(Create("D:\\new")), DeleteFileA(file), CopyFileA(file, "D:\\copy", FALSE),
            CreateDirectoryA("D:\\new", nullptr), RemoveDirectoryA("D:\\empty"),
            RemoveDirectoryA("E:\\"), _chmod(file, _S_IREAD) == 0}),
      "yynnnnnnnn");
}

TEST(Disks, SpaceIsWhatTheSettingsTell) {
  TestMachine pc("[disk C]\nfree = 12287\n[disk D]\nfree = 18446744073709551615\n");
  for (const char* drive : {"drive_d", "drive_e"}) fs::create_directory(pc.Host(drive));
  const std::tuple<const char*, uint64_t, DWORD> rows[] = {
      {"C:", 12287, 2}, {"D:\\", UINT64_MAX, UINT32_MAX}, {"E:", uint64_t{10} << 30, 10 << 18}};
  for (const auto& [root, free, freeClusters] : rows) {
    ULARGE_INTEGER toCaller, total, all;
    DWORD sectors = 0, bytes = 0, clusters = 0, allClusters = 0;
    EXPECT_TRUE(GetDiskFreeSpaceExA(root, &toCaller, &total, &all)) << root;
    EXPECT_TRUE(GetDiskFreeSpaceA(root, &sectors, &bytes, &clusters, &allClusters));
    EXPECT_EQ(toCaller.QuadPart, free) << root;
    EXPECT_TRUE(all.QuadPart >= free && total.QuadPart >= all.QuadPart) << root;
    EXPECT_EQ(sectors * bytes, 4096u);
    EXPECT_EQ(clusters, freeClusters) << root;
  }
}

TEST(Image, CanBeReadOnlyWhileItRuns) {
  for (const std::string where : {"setup.exe", "drive_c/setup.exe"}) {
    for (const std::string family : {"nt", "9x"}) {
      SCOPED_TRACE(where + ' ' + family);
      TestMachine pc("[system]\nplatform = " + family + '\n');
      pc.Write(where, "MZ");
      pc.Write("other.exe", "MZ");
      pc.Restart(where);
      const bool isOutside = where == "setup.exe";  // of the drives: the one file of a drive
      const char* const image = isOutside ? "Z:\\SETUP.exe" : "C:\\SETUP.exe";
      EXPECT_EQ(machine::ImagePath(), isOutside ? "Z:\\setup.exe" : "C:\\setup.exe");
      EXPECT_EQ(Opens(Open(image)), family == "nt");
      const int descriptor = _sopen(image, _O_RDONLY | _O_BINARY, _SH_DENYNO);
      EXPECT_EQ(Told({_close(descriptor) == 0, CopyFileA(image, "C:\\copy", FALSE),
                      CopyFileA("C:\\copy", image, FALSE), Opens(Open(image, GENERIC_WRITE, 3)),
                      _sopen(image, _O_WRONLY | _O_BINARY, _SH_DENYNO) >= 0, Opens(Create(image)),
                      DeleteFileA(image), pc.Read(where) == "MZ"}),
                "yynnnnny");
      if (!isOutside) continue;
      EXPECT_EQ(GetFileAttributesA("Z:\\"), FILE_ATTRIBUTE_DIRECTORY);
      for (const char* name : {"Z:\\", "Z:\\other.exe", "Z:\\setup.exe\\"}) {
        EXPECT_EQ(Told({Opens(Create(name)), Opens(Open(name)), CreateDirectoryA(name, nullptr),
                        RemoveDirectoryA(name), DeleteFileA(name)}),
                  "nnnnn");
      }
    }
  }
}

}  // namespace

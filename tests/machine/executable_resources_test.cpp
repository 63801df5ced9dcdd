// Version resources in programs of all kinds, sound and damaged, and the version functions. Hostile
// files of every kind are the business of the fuzz targets.
#include "machine/executable_resources.h"

#include <gtest/gtest.h>

#include "machine/resource_file.h"
#include "platform/win32.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"

namespace {

constexpr char kPath[] = "\\StringFileInfo\\040c04b0\\FileVersion";
const std::string kVersion = VersionResource({{"CompanyName", "ZEB"}, {"FileVersion", "4.1.7"}});

std::span<const uint8_t> Bytes(const std::string& text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

// A file that the fuzz targets have too, behind their bytes of options.
std::string Seed(const std::string& name, size_t options) {
  return FileBytes(MORIV_SOURCE_DIR "/tests/fuzz/corpus/" + name).substr(options);
}

// The version resource of a file of these bytes, "" for none.
std::string Read(const std::string& file) {
  const auto resource = machine::FindVersionResource(Bytes(file));
  return resource ? std::string(resource->begin(), resource->end()) : "";
}

std::string Query(const std::string& resource, const std::string& path) {
  const auto value =
      machine::QueryVersion(std::vector<uint8_t>(resource.begin(), resource.end()), path);
  return value ? std::string(value->begin(), value->end()) : "none";
}

TEST(ExecutableResources, AreFoundInEveryKindOfProgram) {
  const std::string other = VersionResource({{"FileVersion", "9"}});
  for (const bool is64 : {false, true}) {
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 1, {{0x40C, kVersion}})), kVersion);
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 1, {{0x40C, other}, {0, kVersion}})), kVersion);
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 1, {{0x40C, kVersion}, {0x407, other}})), kVersion);
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 2, {{0, kVersion}})), "");
    EXPECT_EQ(Read(PortableExecutable(is64, 6, 1, {{0, kVersion}})), "");
  }
  std::string native = Seed("version/native-program", 1);
  EXPECT_EQ(Read(native + "a package behind it"), kVersion);
  EXPECT_EQ(Read(native.replace(native.find(".moriv_res"), 6, ".other")), "");
  const TemporaryFolder folder;
  EXPECT_FALSE(machine::ReadVersionResource(folder.Path()));
  EXPECT_FALSE(machine::ReadVersionResource(folder.Path() / "absent.exe"));
}

// What comes out of a file with an extreme byte anywhere lies within it. Run under a sanitizer this
// is the proof that no offset is followed unchecked.
TEST(ExecutableResources, OfADamagedFileStayWithinIt) {
  for (const std::string& sound :
       {PortableExecutable(false, 16, 1, {{0, kVersion}}),
        PortableExecutable(true, 16, 1, {{0, kVersion}}), Seed("version/native-program", 1)}) {
    ASSERT_EQ(Read(sound), kVersion);
    for (size_t at = 0; at < sound.size(); ++at) {
      const std::string cut = Read(sound.substr(0, at));
      EXPECT_TRUE(cut.empty() || (cut == kVersion && at + 64 >= sound.size())) << at;
      for (const int byte : {0x00, 0x01, 0x7F, 0x80, 0xFF}) {
        std::string file = sound;
        file[at] = static_cast<char>(byte);
        const std::string resource = Read(file);
        EXPECT_LE(resource.size(), file.size());
        Query(resource, kPath);
        Query(resource, "\\VarFileInfo\\Translation");
      }
    }
  }
}

TEST(ExecutableResources, ResourceFileIsSearchedByNumbersAndLanguage) {
  // A picture with a name, which is passed over; (6, 1) in French and neutral; (6, 2) in French and
  // German; (14, 1), which is empty.
  const std::string file = Seed("resource/names-and-languages", 2);
  const auto find = [&](int type, int id) {
    const auto found = machine::FindInResourceFile(Bytes(file), type, id);
    return found ? std::string(found->begin(), found->end()) : "none";
  };
  EXPECT_EQ(find(6, 1) + ' ' + find(6, 2) + ' ' + find(14, 1) + ' ' + find(6, 3),
            "neutral only  none");
}

TEST(VersionBlock, OddLengthsOfATextDoNoHarm) {
  const std::string wide = ByteBuilder().Wide("1.2").U16(0).bytes();
  const struct {
    size_t length;
    std::string value;
    const char* text;
  } rows[] = {
      {4, wide, "1.2"},
      {8, wide, "1.2"},               // counted in bytes
      {0xFFFF, wide, "1.2"},          // counted beyond the block
      {3, wide.substr(0, 6), "1.2"},  // without a NUL
      {2, wide, "1."},
      {0, "", ""},
  };
  for (const auto& row : rows) {
    const std::string text = VersionBlock("FileVersion", true, row.length, row.value, {});
    const std::string table = VersionBlock("040c04b0", true, 0, "", {text});
    const std::string info = VersionBlock("StringFileInfo", true, 0, "", {table});
    EXPECT_EQ(Query(VersionBlock("VS_VERSION_INFO", false, 0, "", {info}), kPath), row.text);
  }
}

TEST(VersionFunctions, FillAndAskABlockOfTheirOwnForm) {
  const TestMachine pc;
  // A text that fills the resource to its last byte, without a NUL, has the tightest copy.
  const std::string tight = VersionBlock("T", true, 9, ByteBuilder().Wide("123456789").bytes(), {});
  pc.Write("drive_c/a.dll", PortableExecutable(true, 16, 1, {{0, kVersion}}));
  pc.Write("drive_c/b.dll",
           PortableExecutable(true, 16, 1,
                              {{0, VersionBlock("VS_VERSION_INFO", false, 0, "", {tight})}}));
  for (const char* file : {"C:\\A.DLL", "C:\\B.DLL"}) {
    const DWORD size = GetFileVersionInfoSizeA(file, nullptr);
    std::vector<uint8_t> block(size, 0xCD);
    void *company = nullptr, *value = nullptr;
    UINT length = 0;
    EXPECT_FALSE(VerQueryValueA(block.data(), "\\", &value, &length)) << "not filled";
    ASSERT_TRUE(GetFileVersionInfoA(file, 0, size, block.data()));
    const bool isTight = VerQueryValueA(block.data(), "\\T", &value, &length);
    if (isTight) {
      EXPECT_STREQ(static_cast<const char*>(value), "123456789");
      EXPECT_LE(static_cast<uint8_t*>(value) + length, block.data() + size);
    } else {  // answers don't share their room
      EXPECT_TRUE(VerQueryValueA(block.data(), kPath, &value, &length));
      EXPECT_TRUE(VerQueryValueA(block.data(), "\\StringFileInfo\\040c04b0\\CompanyName", &company,
                                 &length));
      EXPECT_STREQ(static_cast<const char*>(value), "4.1.7");
      EXPECT_STREQ(static_cast<const char*>(company), "ZEB");
    }
    EXPECT_FALSE(GetFileVersionInfoA(file, 0, size - 1, block.data()));
    EXPECT_FALSE(VerQueryValueA(block.data(), "\\", &value, &length));
  }
}

}  // namespace

// Version resources in programs of all kinds, and the version functions. Hostile files are the
// business of the fuzz targets.
#include "machine/executable_resources.h"

#include <gtest/gtest.h>

#include "machine/resource_file.h"
#include "platform/win32.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"

namespace {

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

TEST(ExecutableResources, AreFoundInEveryKindOfProgram) {
  const std::string other = VersionResource({{"FileVersion", "9"}});
  for (const bool is64 : {false, true}) {
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 1, {{0x40C, kVersion}})), kVersion);
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 1, {{0x40C, other}, {0, kVersion}})), kVersion);
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 1, {{0x40C, kVersion}, {0x407, other}})), kVersion);
    EXPECT_EQ(Read(PortableExecutable(is64, 16, 2, {{0, kVersion}})), "");
    EXPECT_EQ(Read(PortableExecutable(is64, 6, 1, {{0, kVersion}})), "");
    std::string file = PortableExecutable(is64, 16, 1, {{0, kVersion}});
    const size_t sizeField = file.find(ByteBuilder().U32(kVersion.size()).bytes());
    file.replace(sizeField, 4, ByteBuilder().U32(file.size()).bytes());
    EXPECT_EQ(Read(file), "") << "reaches beyond its section";
  }
  std::string native = Seed("version/native-program", 1);
  EXPECT_EQ(Read(native + "a package behind it"), kVersion);
  EXPECT_EQ(Read(native.replace(native.find(".moriv_res"), 6, ".other")), "");
  const TemporaryFolder folder;
  EXPECT_FALSE(machine::ReadVersionResource(folder.Path()));
  EXPECT_FALSE(machine::ReadVersionResource(folder.Path() / "absent.exe"));
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
  const std::tuple<size_t, std::string, const char*> rows[] = {
      {4, wide, "1.2"},
      {8, wide, "1.2"},               // counted in bytes
      {0xFFFF, wide, "1.2"},          // counted beyond the block
      {3, wide.substr(0, 6), "1.2"},  // without a NUL
      {2, wide, "1."},
      {0, "", ""},
  };
  for (const auto& [length, value, expected] : rows) {
    const std::string text = VersionBlock("FileVersion", true, length, value, {});
    const std::string table = VersionBlock("040c04b0", true, 0, "", {text});
    const std::string info = VersionBlock("StringFileInfo", true, 0, "", {table});
    const std::string resource = VersionBlock("VS_VERSION_INFO", false, 0, "", {info});
    const auto found = machine::QueryVersion({resource.begin(), resource.end()},
                                             "\\StringFileInfo\\040c04b0\\FileVersion");
    ASSERT_TRUE(found) << expected;
    EXPECT_EQ(std::string(found->begin(), found->end()), expected);
  }
}

TEST(VersionFunctions, FillAndAskABlockOfTheirOwnForm) {
  const TestMachine pc;
  // A text that fills the resource to its last byte, without a NUL, has the tightest copy.
  const std::string a = VersionBlock("A", true, 9, ByteBuilder().Wide("abcdefghi").bytes(), {});
  const std::string b = VersionBlock("B", true, 9, ByteBuilder().Wide("123456789").bytes(), {});
  const std::string resource = VersionBlock("VS_VERSION_INFO", false, 0, "", {a, b});
  pc.Write("drive_c/a.dll", PortableExecutable(true, 16, 1, {{0, resource}}));
  const DWORD size = GetFileVersionInfoSizeA("C:\\A.DLL", nullptr);
  std::vector<uint8_t> block(size, 0xCD);
  void *first = nullptr, *last = nullptr;
  UINT length = 0;
  EXPECT_FALSE(VerQueryValueA(block.data(), "\\", &first, &length)) << "not filled";
  ASSERT_TRUE(GetFileVersionInfoA("C:\\A.DLL", 0, size, block.data()));
  EXPECT_TRUE(VerQueryValueA(block.data(), "\\A", &first, &length));
  EXPECT_TRUE(VerQueryValueA(block.data(), "\\B", &last, &length));
  EXPECT_LE(static_cast<uint8_t*>(last) + length, block.data() + size);
  EXPECT_STREQ(static_cast<const char*>(first), "abcdefghi");  // answers don't share their room
  EXPECT_STREQ(static_cast<const char*>(last), "123456789");
  EXPECT_FALSE(GetFileVersionInfoA("C:\\A.DLL", 0, size - 1, block.data()));
  EXPECT_FALSE(VerQueryValueA(block.data(), "\\", &first, &length));
}

}  // namespace

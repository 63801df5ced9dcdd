// Version resources in programs of all kinds, sound and damaged, and the version functions.
#include "machine/executable_resources.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>

#include "machine/resource_file.h"
#include "platform/win32.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"

namespace {

const std::string kVersion = VersionResource({{"CompanyName", "ZEB"}, {"FileVersion", "4.1.7"}});

std::span<const uint8_t> Bytes(const std::string& text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
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
  const std::string resources = ResourceFile({{6, 7, 0, "odd"}, {16, 1, 0, kVersion}});
  EXPECT_EQ(Read(NativeExecutable(".moriv_res", resources) + "a package behind it"), kVersion);
  EXPECT_EQ(Read(NativeExecutable(".other_res", resources)), "");
  const TemporaryFolder folder;
  EXPECT_FALSE(machine::ReadVersionResource(folder.Path()));
  EXPECT_FALSE(machine::ReadVersionResource(folder.Path() / "absent.exe"));
}

// What comes out of a file that is cut short, or has an extreme byte anywhere, lies within it. Run
// under a sanitizer this is the proof that no offset is followed unchecked.
TEST(ExecutableResources, OfADamagedFileStayWithinIt) {
  for (const std::string& sound :
       {PortableExecutable(false, 16, 1, {{0, kVersion}}),
        PortableExecutable(true, 16, 1, {{0, kVersion}}),
        NativeExecutable(".moriv_res", ResourceFile({{16, 1, 0, kVersion}}))}) {
    ASSERT_EQ(Read(sound), kVersion);
    for (size_t at = 0; at < sound.size(); ++at) {
      // The last section header of the native program holds nothing that is read but its start.
      if (const std::string read = Read(sound.substr(0, at)); !read.empty()) {
        EXPECT_GE(at + 64, sound.size());
        EXPECT_EQ(read, kVersion);
      }
      for (const int byte : {0x00, 0x01, 0x7F, 0x80, 0xFF}) {
        std::string file = sound;
        file[at] = static_cast<char>(byte);
        const std::string resource = Read(file);
        EXPECT_LE(resource.size(), file.size());
        Query(resource, "\\StringFileInfo\\040c04b0\\FileVersion");
        Query(resource, "\\VarFileInfo\\Translation");
      }
    }
  }
}

TEST(ExecutableResources, ResourceFileIsSearchedByNumbersAndLanguage) {
  ByteBuilder named;  // passed over
  named.U32(3).U32(40).Wide("PIC").U16(0).Wide("A").U16(0).Align().PadTo(40).Append("abc").Align();
  const std::string file = named.bytes() + ResourceFile({{6, 1, 0x40C, "french"},
                                                         {6, 1, 0, "neutral"},
                                                         {6, 2, 0x40C, "only"},
                                                         {6, 2, 0x407, "late"},
                                                         {14, 1, 0, ""}});
  const auto find = [&](int type, int id) {
    const auto found = machine::FindInResourceFile(Bytes(file), type, id);
    return found ? std::string(found->begin(), found->end()) : "none";
  };
  EXPECT_EQ(find(6, 1), "neutral");
  EXPECT_EQ(find(6, 2), "only");
  EXPECT_EQ(find(14, 1), "");
  EXPECT_EQ(find(6, 3), "none");
}

TEST(VersionBlock, OddLengthsOfATextDoNoHarm) {
  const auto withValue = [](size_t length, const std::string& value) {
    const std::string text = VersionBlock("FileVersion", true, length, value, {});
    const std::string table = VersionBlock("040c04b0", true, 0, "", {text});
    return VersionBlock("VS_VERSION_INFO", false, 0, "",
                        {VersionBlock("StringFileInfo", true, 0, "", {table})});
  };
  const std::string path = "\\StringFileInfo\\040c04b0\\FileVersion";
  const std::string wide = ByteBuilder().Wide("1.2").U16(0).bytes();
  EXPECT_EQ(Query(withValue(4, wide), path), "1.2");
  EXPECT_EQ(Query(withValue(8, wide), path), "1.2");               // counted in bytes
  EXPECT_EQ(Query(withValue(0xFFFF, wide), path), "1.2");          // counted beyond the block
  EXPECT_EQ(Query(withValue(3, wide.substr(0, 6)), path), "1.2");  // without a NUL
  EXPECT_EQ(Query(withValue(2, wide), path), "1.");
  EXPECT_EQ(Query(withValue(0, ""), path), "");
}

class VersionFunctions : public testing::Test {
 protected:
  // Room for the version block of a file with this resource.
  std::unique_ptr<uint8_t[]> Block(const std::string& resource) {
    machine_.Write("drive_c/a.dll", PortableExecutable(true, 16, 1, {{0, resource}}));
    size_ = GetFileVersionInfoSizeA(kFile, nullptr);
    auto block = std::make_unique<uint8_t[]>(size_);
    std::fill_n(block.get(), size_, uint8_t{0xCD});
    return block;
  }

  static constexpr char kFile[] = "C:\\A.DLL";
  TestMachine machine_;
  DWORD size_ = 0;
};

TEST_F(VersionFunctions, NothingIsFoundInABlockThatWasNotFilled) {
  const auto block = Block(kVersion);
  void* value = nullptr;
  UINT length = 0;
  EXPECT_EQ(VerQueryValueA(block.get(), "\\", &value, &length), FALSE);
  ASSERT_EQ(GetFileVersionInfoA(kFile, 0, size_, block.get()), TRUE);
  EXPECT_EQ(GetFileVersionInfoA(kFile, 0, size_ - 1, block.get()), FALSE);
  EXPECT_EQ(VerQueryValueA(block.get(), "\\", &value, &length), FALSE);
}

TEST_F(VersionFunctions, AnswersDoNotShareTheirRoom) {
  const auto block = Block(kVersion);
  ASSERT_EQ(GetFileVersionInfoA(kFile, 0, size_, block.get()), TRUE);
  void* value = nullptr;
  void* company = nullptr;
  UINT length = 0;
  const std::string table = "\\StringFileInfo\\040c04b0\\";
  EXPECT_EQ(VerQueryValueA(block.get(), (table + "FileVersion").c_str(), &value, &length), TRUE);
  EXPECT_EQ(VerQueryValueA(block.get(), (table + "CompanyName").c_str(), &company, &length), TRUE);
  EXPECT_STREQ(static_cast<const char*>(value), "4.1.7");
  EXPECT_STREQ(static_cast<const char*>(company), "ZEB");
}

// A text that fills the resource to its last byte, without a NUL, has the tightest copy.
TEST_F(VersionFunctions, TextAtTheVeryEndFitsTheRoom) {
  const std::string text = VersionBlock("T", true, 9, ByteBuilder().Wide("123456789").bytes(), {});
  const auto block = Block(VersionBlock("VS_VERSION_INFO", false, 0, "", {text}));
  ASSERT_EQ(GetFileVersionInfoA(kFile, 0, size_, block.get()), TRUE);
  void* value = nullptr;
  UINT length = 0;
  ASSERT_EQ(VerQueryValueA(block.get(), "\\T", &value, &length), TRUE);
  EXPECT_EQ(length, 10u);
  EXPECT_STREQ(static_cast<const char*>(value), "123456789");
  EXPECT_LE(static_cast<uint8_t*>(value) + length, block.get() + size_);
}

}  // namespace

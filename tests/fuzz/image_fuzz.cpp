// A whole image: hostile bytes behind a small program, installed and removed silently. Nothing but
// the targets of its records and the program's own four files is written, and a removal takes what
// an install wrote.
//
//   0     how it is run: the bits below
//   1...  the package
#include <cstring>
#include <optional>
#include <set>

#include "engine/resolver.h"
#include "machine/drives.h"
#include "package/package_format.h"
#include "tests/fuzz/silent_run.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

constexpr uint8_t kOldFamily = 1;
constexpr uint8_t kByRemovalProgram = 2;
constexpr uint8_t kHasBrowser = 4;

constexpr char kSettings[] = "[disk C]\nwritable = 200000\n[system]\nplatform = ";
constexpr char kImage[] = "drive_c/setup.exe";
constexpr char kRemovalProgram[] = "drive_c/windows/MorivRmv.exe";

template <typename Record>
std::optional<Record> ReadAt(const std::string& bytes, uint64_t offset) {
  Record record;
  if (offset > bytes.size() || bytes.size() - offset < sizeof(record)) return std::nullopt;
  std::memcpy(&record, bytes.data() + offset, sizeof(record));
  return record;
}

// Where on the host the files of the package go that a walk over it reaches.
std::set<std::filesystem::path> TargetsOf(const std::string& image) {
  std::set<std::filesystem::path> hosts;
  const auto header = ReadAt<PackageHeader>(image, image.size() - sizeof(PackageHeader));
  uint64_t offset = header->dataOffset;
  for (int i = 0; i < header->recordCount; ++i) {
    const auto record = ReadAt<FileRecord>(image, offset);
    if (!record || record->recordSize != sizeof(FileRecord)) break;
    SetupContext context = {};
    TargetList list = {};
    (void)ResolveTargets(&context, &list, "C:\\Moriv", &*record, false);
    for (int32_t target = 0; target < list.count; ++target) {
      if (const auto location = machine::Locate(list.entries[target].path)) {
        hosts.insert(location->host);
      }
    }
    FreeTargets(&list);
    offset += sizeof(FileRecord) + record->storedSize;
  }
  return hosts;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzInput input(data, size);
  const uint8_t how = input.TakeByte();
  static const std::string executable = VersionedProgram("4.1.7");
  const std::string image = executable + std::string(input.rest());

  TestMachine pc(kSettings + std::string((how & kOldFamily) != 0 ? "9x\n" : "nt\n"));
  if ((how & kHasBrowser) != 0) {
    pc.Write("drive_c/opera/opera.exe", "");
    SetRegistryText(AppPathsKey("Opera.exe"), "Path", "C:\\opera");
  }
  pc.Write(kImage, image);
  pc.Write("drive_c/Moriv/kept.txt", "kept");
  pc.Write("drive_c/windows/system32/kept.dll", "kept");
  const auto before = FilesOf(pc);

  const StatusCode installed = RunSilently(pc, kImage, "/s /r /d:C:\\Moriv");
  const auto targets = TargetsOf(image);
  std::set<std::filesystem::path> own;
  for (const char* name : {"MorivRmv.exe", "MorivLog.txt", "Moriv.INF"}) {
    own.insert(pc.Host("drive_c/windows") / name);
  }
  own.insert(pc.Host(kImage));
  for (const auto& [file, bytes] : FilesOf(pc)) {
    const auto old = before.find(file);
    const bool isUntouched = old != before.end() && old->second == bytes;
    EXPECT_TRUE(isUntouched || targets.contains(file) || own.contains(file)) << file;
  }
  EXPECT_TRUE(pc.Read(kImage) == image);

  const bool byRemovalProgram = (how & kByRemovalProgram) != 0 && pc.Has(kRemovalProgram);
  const StatusCode removed =
      RunSilently(pc, byRemovalProgram ? kRemovalProgram : kImage, "/s /u /r /d:C:\\Moriv");
  if (installed != StatusOk) return 0;
  EXPECT_EQ(removed, StatusOk);
  for (const std::filesystem::path& target : targets) {
    std::error_code tooLong;  // a name can be: in UTF-8 it has more bytes
    EXPECT_TRUE(own.contains(target) || !std::filesystem::is_regular_file(target, tooLong))
        << target;
  }
  return 0;
}

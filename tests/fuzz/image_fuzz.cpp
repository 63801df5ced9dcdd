// A whole image: hostile bytes behind a small program, installed and removed silently. Nothing but
// what its records name and the program's own three files is touched, and a removal takes what an
// install wrote.
//
//   0     how it is run: the bits below
//   1...  the package
#include <iterator>
#include <set>

#include "machine/drives.h"
#include "tests/fuzz/silent_run.h"
#include "tests/support/machine_state.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"
#include "tools/image/record_text.h"

namespace {

constexpr uint8_t kOldFamily = 1;
constexpr uint8_t kByRemovalProgram = 2;
constexpr uint8_t kHasBrowser = 4;

constexpr char kSettings[] = "[disk C]\nwritable = 200000\n[system]\nplatform = ";
constexpr char kRemovalProgram[] = "drive_c/windows/MorivRmv.exe";

using Files = std::map<std::string, std::string>;
using Places = std::set<std::string>;  // paths below the machine's folder

// Wherever on the host the files of the package may go that a walk over it reaches: what a record's
// element names, with or without the macro in front of it, in any directory that a macro can mean,
// or the element as it stands.
Places PlacesOf(const std::string& bytes, const TestMachine& pc) {
  Places places;
  const auto add = [&](const std::string& path) {
    const auto location = machine::Locate(path);
    if (location) places.insert(location->host.lexically_relative(pc.Path()));
  };
  ImageBuilder taken = ImageBuilder::TakenApart(bytes);
  for (const ImageBuilder::Piece& piece : taken.pieces()) {
    if (piece.record.recordSize != sizeof(FileRecord)) break;
    const std::string name = '\\' + image::FieldText(piece.record.fileName);
    std::istringstream elements(image::FieldText(piece.record.destination));
    for (std::string element; std::getline(elements, element, ';');) {
      add(element + name);
      const size_t macroEnd = element.starts_with('%') ? element.find('%', 1) + 1 : 0;
      for (const char* directory :
           {"C:\\Moriv\\", "C:\\windows\\", "C:\\windows\\system32\\", "C:\\opera\\Plugins\\"}) {
        add(directory + element + name);
        add(directory + element.substr(macroEnd) + name);
      }
    }
  }
  return places;
}

// The files on the drive that are not the same in both.
Places Differences(const Files& before, const Files& after) {
  std::vector<Files::value_type> items;
  std::ranges::set_symmetric_difference(before, after, std::back_inserter(items));
  Places places;
  for (const auto& [path, content] : items) {
    if (path.starts_with("drive_c/") && content != kFolder) places.insert(path);
  }
  return places;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  std::string_view input = TextOf(data, size);
  const uint8_t how = TakeByte(&input);
  const std::string image = VersionedProgram("4.1.7") + std::string(input);

  TestMachine pc(kSettings + std::string((how & kOldFamily) != 0 ? "9x\n" : "nt\n"));
  if ((how & kHasBrowser) != 0) {
    pc.Write("drive_c/opera/opera.exe", "");
    SetRegistryText(AppPathsKey("Opera.exe"), "Path", "C:\\opera");
  }
  pc.Write(kImage, image);
  pc.Write("drive_c/Moriv/kept.txt", "kept");
  pc.Write("drive_c/windows/system32/kept.dll", "kept");
  const Files before = ReadMachine(pc.Path()).files;
  const StatusCode installed = RunSilently(pc, kImage, "/s /r /d:C:\\Moriv");
  const Files between = ReadMachine(pc.Path()).files;
  const Places places = PlacesOf(image, pc);
  EXPECT_TRUE(pc.Read(kImage) == image);

  const bool byRemovalProgram = (how & kByRemovalProgram) != 0 && pc.Has(kRemovalProgram);
  const StatusCode removed =
      RunSilently(pc, byRemovalProgram ? kRemovalProgram : kImage, "/s /u /r /d:C:\\Moriv");
  const Files after = ReadMachine(pc.Path()).files;
  const Places own = {kRemovalProgram, kLogPath, "drive_c/windows/Moriv.INF"};
  for (const Files& now : {between, after}) {
    for (const std::string& file : Differences(before, now))
      EXPECT_TRUE(places.contains(file) || own.contains(file)) << file;
  }
  if (installed != StatusOk) return 0;
  EXPECT_EQ(removed, StatusOk);
  for (const std::string& file : Differences(before, between))
    EXPECT_TRUE(own.contains(file) || !after.contains(file)) << file;
  return 0;
}

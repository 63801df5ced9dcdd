#include "machine/executable_resources.h"

#include <algorithm>
#include <span>
#include <string_view>

#include "machine/bounded_bytes.h"
#include "machine/mapped_file.h"
#include "machine/resource_file.h"
#include "machine/version_block.h"

namespace machine {
namespace {

using Bytes = std::span<const uint8_t>;

constexpr int kVersionType = 16;
constexpr int kVersionId = 1;

// ---- PE

constexpr uint64_t kCoffHeaderSize = 20;  // behind the 4 bytes "PE\0\0"
constexpr uint64_t kSectionHeaderSize = 40;
constexpr uint64_t kResourceDirectory = 2;  // indices among the data directories
constexpr uint64_t kCertificateDirectory = 4;
constexpr uint64_t kDirectoryHeaderSize = 16;
constexpr uint32_t kHighBit = 0x80000000;  // of an entry: named, or a directory below
constexpr uint16_t kMagic32 = 0x10B;
constexpr uint16_t kMagic64 = 0x20B;

class PortableExecutable {
 public:
  explicit PortableExecutable(Bytes file) : file_(file) {}

  // The resource tree has three levels: type, id, language.
  std::optional<Bytes> FindResource(int type, int id) {
    if (!ReadHeaders()) return std::nullopt;
    const uint64_t root = DirectoryStart(kResourceDirectory);
    if (!file_.good() || root == 0) return std::nullopt;
    const std::optional<Bytes> section = FromAddress(root);
    if (!section) return std::nullopt;
    BoundedBytes tree(*section);

    const std::optional<uint32_t> types = FindEntry(tree, kHighBit, type);
    const std::optional<uint32_t> ids = types ? FindEntry(tree, *types, id) : std::nullopt;
    std::optional<uint32_t> entry = ids ? FindEntry(tree, *ids, 0) : std::nullopt;
    if (ids && !entry) entry = FirstEntry(tree, *ids);
    if (!entry || (*entry & kHighBit) != 0) return std::nullopt;

    // The leaf: the data's address and its size.
    const uint64_t address = tree.U32(*entry);
    const uint64_t size = tree.U32(uint64_t{*entry} + 4);
    const std::optional<Bytes> data = FromAddress(address);
    if (!tree.good() || !data || size > data->size()) return std::nullopt;
    return data->first(size);
  }

  std::optional<ProgramExtent> FindExtent() {
    if (!ReadHeaders()) return std::nullopt;
    ProgramExtent extent{0, DirectoryStart(kCertificateDirectory) != 0};
    for (uint64_t index = 0; index < sectionCount_; ++index) {
      const uint64_t section = sections_ + index * kSectionHeaderSize;
      extent.end = std::max<uint64_t>(extent.end,
                                      uint64_t{file_.U32(section + 20)} + file_.U32(section + 16));
    }
    if (!file_.good()) return std::nullopt;
    return extent;
  }

 private:
  // Finds the section headers and the data directories; false for a file that is no program.
  bool ReadHeaders() {
    if (file_.U16(0) != 0x5A4D) return false;  // "MZ"
    const uint64_t header = file_.U32(0x3C);
    if (file_.U32(header) != 0x4550) return false;  // "PE\0\0"
    sectionCount_ = file_.U16(header + 4 + 2);
    const uint64_t optionalSize = file_.U16(header + 4 + 16);
    const uint64_t optional = header + 4 + kCoffHeaderSize;
    sections_ = optional + optionalSize;

    const uint16_t magic = file_.U16(optional);
    if (magic != kMagic32 && magic != kMagic64) return false;
    const uint64_t fixed = magic == kMagic32 ? 96 : 112;  // with the directories' count at its end
    directories_ = optional + fixed;
    directoryCount_ = optionalSize < fixed ? 0
                                           : std::min<uint64_t>(file_.U32(directories_ - 4),
                                                                (optionalSize - fixed) / 8);
    return file_.good();
  }

  // Where the data of a directory is, by address or, of certificates, in the file; 0 for none.
  uint64_t DirectoryStart(uint64_t index) {
    return index < directoryCount_ ? file_.U32(directories_ + index * 8) : 0;
  }

  // The file's bytes from this address to the end of its section.
  std::optional<Bytes> FromAddress(uint64_t address) {
    for (uint64_t index = 0; index < sectionCount_; ++index) {
      const uint64_t section = sections_ + index * kSectionHeaderSize;
      const uint64_t start = file_.U32(section + 12);
      const uint64_t size = file_.U32(section + 16);  // in the file
      const uint64_t position = file_.U32(section + 20);
      if (address < start || address - start >= size) continue;
      const Bytes bytes = file_.Slice(position, size);
      if (!file_.good()) return std::nullopt;
      return bytes.subspan(address - start);
    }
    return std::nullopt;
  }

  // A directory: header with the counts of named and numbered entries, then the entries, named ones
  // first, of 8 bytes: number, and offset of what is below. Directories have the high bit set.
  static std::optional<uint32_t> FindEntry(BoundedBytes& tree, uint32_t directory, int id) {
    if ((directory & kHighBit) == 0) return std::nullopt;
    const uint64_t start = directory & ~kHighBit;
    const uint64_t named = tree.U16(start + 12);
    const uint64_t numbered = tree.U16(start + 14);
    for (uint64_t index = named; index < named + numbered; ++index) {
      const uint64_t entry = start + kDirectoryHeaderSize + index * 8;
      const bool matches = tree.U32(entry) == static_cast<uint32_t>(id);
      const uint32_t below = tree.U32(entry + 4);
      if (!tree.good()) return std::nullopt;
      if (matches) return below;
    }
    return std::nullopt;
  }

  static std::optional<uint32_t> FirstEntry(BoundedBytes& tree, uint32_t directory) {
    if ((directory & kHighBit) == 0) return std::nullopt;
    const uint64_t start = directory & ~kHighBit;
    if (tree.U16(start + 12) + tree.U16(start + 14) == 0) return std::nullopt;
    const uint32_t below = tree.U32(start + kDirectoryHeaderSize + 4);
    if (!tree.good()) return std::nullopt;
    return below;
  }

  BoundedBytes file_;
  uint64_t sections_ = 0;  // offset of their headers
  uint64_t sectionCount_ = 0;
  uint64_t directories_ = 0;
  uint64_t directoryCount_ = 0;
};

// ---- ELF, 64 bits, little-endian

constexpr uint64_t kElfSectionHeaderSize = 64;

bool NameIs(BoundedBytes& file, uint64_t offset, std::string_view name) {
  const Bytes text = file.Slice(offset, name.size() + 1);
  return text.size() == name.size() + 1 && std::equal(name.begin(), name.end(), text.begin()) &&
         text.back() == 0;
}

std::optional<Bytes> FindElfSection(Bytes bytes, std::string_view name) {
  BoundedBytes file(bytes);
  if (file.U32(0) != 0x464C457F || file.U16(4) != 0x0102) return std::nullopt;  // "\x7F" "ELF"
  const uint64_t headers = file.U64(40);
  if (file.U16(58) != kElfSectionHeaderSize || headers > file.size()) return std::nullopt;
  const uint64_t count = file.U16(60);
  const uint64_t names = file.U64(headers + file.U16(62) * kElfSectionHeaderSize + 24);
  if (!file.good() || names > file.size()) return std::nullopt;

  for (uint64_t index = 0; index < count; ++index) {
    const uint64_t header = headers + index * kElfSectionHeaderSize;
    BoundedBytes nameReader(bytes);  // an odd name condemns its own section alone
    if (!NameIs(nameReader, names + file.U32(header), name)) continue;
    const Bytes section = file.Slice(file.U64(header + 24), file.U64(header + 32));
    if (!file.good()) return std::nullopt;
    return section;
  }
  return std::nullopt;
}

std::vector<uint8_t> Copy(Bytes bytes) {
  return {bytes.begin(), bytes.end()};
}

}  // namespace

std::optional<Bytes> FindProgramResource(Bytes file, int type, int id) {
  if (const std::optional<Bytes> section = FindElfSection(file, kNativeResourceSection)) {
    return FindInResourceFile(*section, type, id);
  }
  return PortableExecutable(file).FindResource(type, id);
}

std::optional<ProgramExtent> FindProgramExtent(Bytes file) {
  return PortableExecutable(file).FindExtent();
}

std::optional<std::vector<uint8_t>> ReadVersionResource(const std::filesystem::path& path) {
  return FindVersionResource(MappedFile(path).bytes());
}

std::optional<std::vector<uint8_t>> FindVersionResource(Bytes file) {
  const std::optional<Bytes> resource = FindProgramResource(file, kVersionType, kVersionId);
  if (!resource || !IsVersionBlock(*resource)) return std::nullopt;
  return Copy(*resource);
}

std::optional<std::vector<uint8_t>> QueryVersion(const std::vector<uint8_t>& resource,
                                                 const std::string& path) {
  const std::optional<VersionValue> value = FindVersionValue(resource, path);
  if (!value) return std::nullopt;
  if (!value->isText) return Copy(Bytes(resource).subspan(value->offset, value->size));
  const std::string text = VersionText(resource, *value);
  return std::vector<uint8_t>(text.begin(), text.end());
}

}  // namespace machine

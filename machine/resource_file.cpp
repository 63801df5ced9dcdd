#include "machine/resource_file.h"

#include "machine/bounded_bytes.h"

namespace machine {
namespace {

// An entry:   0  u32  bytes of data
//             4  u32  bytes of this header
//             8       type, then name: u16 0xFFFF and the number, or a UTF-16 text with its NUL
//   at the next multiple of 4:  u32 data version, u16 memory flags, u16 language, u32 version,
//                               u32 characteristics
// The data follows the header; the next entry begins at a multiple of 4.
constexpr uint64_t kHeaderStart = 8;
constexpr uint64_t kLanguageOffset = 6;
constexpr uint16_t kNumberMark = 0xFFFF;

// Reads a type or name and moves `offset` behind it. -1 for one that is a text.
int TakeNumber(BoundedBytes& file, uint64_t* offset) {
  const uint16_t first = file.U16(*offset);
  *offset += 2;
  if (first == kNumberMark) {
    *offset += 2;
    return file.U16(*offset - 2);
  }
  for (uint16_t unit = first; unit != 0; *offset += 2) unit = file.U16(*offset);
  return -1;
}

}  // namespace

std::optional<std::span<const uint8_t>> FindInResourceFile(std::span<const uint8_t> bytes, int type,
                                                           int id) {
  BoundedBytes file(bytes);
  std::optional<std::span<const uint8_t>> found;
  for (uint64_t entry = 0; entry < file.size();) {
    const uint64_t dataSize = file.U32(entry);
    const uint64_t headerSize = file.U32(entry + 4);
    uint64_t offset = entry + kHeaderStart;
    const int entryType = TakeNumber(file, &offset);
    const int entryId = TakeNumber(file, &offset);
    const uint16_t language = file.U16(AlignUp(offset) + kLanguageOffset);
    const std::span<const uint8_t> data = file.Slice(entry + headerSize, dataSize);
    if (!file.good() || headerSize < kHeaderStart) return found;
    if (entryType == type && entryId == id) {
      if (language == 0) return data;
      if (!found) found = data;
    }
    entry = AlignUp(entry + headerSize + dataSize);
  }
  return found;
}

}  // namespace machine

// Little-endian reads from bytes that nobody vouches for.
//
// A read outside the bytes gives 0, or an empty slice, and lowers `good` for all time; a reader
// asks once, at the end, whether all that it saw was there.
#pragma once

#include <cstdint>
#include <span>

namespace machine {

// The next multiple of 4, where the parts of a resource begin.
constexpr uint64_t AlignUp(uint64_t offset) {
  return (offset + 3) & ~uint64_t{3};
}

class BoundedBytes {
 public:
  explicit BoundedBytes(std::span<const uint8_t> bytes) : bytes_(bytes) {}

  std::span<const uint8_t> Slice(uint64_t offset, uint64_t size) {
    if (offset > bytes_.size() || size > bytes_.size() - offset) {
      good_ = false;
      return {};
    }
    return bytes_.subspan(offset, size);
  }

  uint16_t U16(uint64_t offset) { return static_cast<uint16_t>(Number(offset, 2)); }
  uint32_t U32(uint64_t offset) { return static_cast<uint32_t>(Number(offset, 4)); }
  uint64_t U64(uint64_t offset) { return Number(offset, 8); }

  uint64_t size() const { return bytes_.size(); }
  bool good() const { return good_; }

 private:
  uint64_t Number(uint64_t offset, unsigned width) {
    uint64_t number = 0;
    unsigned shift = 0;
    for (const uint8_t byte : Slice(offset, width)) {
      number |= uint64_t{byte} << shift;
      shift += 8;
    }
    return number;
  }

  std::span<const uint8_t> bytes_;
  bool good_ = true;
};

}  // namespace machine

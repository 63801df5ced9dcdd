// The packer's table: the code of each string that the decoder has an entry for.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "tools/image/stream_format.h"

namespace image {

// A string is named by its code: a byte's own value, or the code of an entry.
class CodeTable {
 public:
  static constexpr uint32_t kNoCode = 0;  // a byte, so never the code of a longer string

  CodeTable();

  // Forgets all entries.
  void Clear();

  // The code of the string of `prefix` with `byte` behind it, kNoCode when it has no entry.
  uint32_t Find(uint32_t prefix, uint8_t byte) const {
    const uint32_t key = KeyOf(prefix, byte);
    for (uint32_t index = HomeOf(key);; index = (index + 1) % kSlotCount) {
      const Slot& slot = slots_[index];
      if (slot.key == key) return slot.code;
      if (slot.key == kFreeSlot) return kNoCode;
    }
  }

  // Gives that string, which has no entry yet, the code `code`, at most kLastCode.
  void Add(uint32_t prefix, uint8_t byte, uint32_t code);

  // The code of an entry's string without its last byte.
  uint32_t PrefixOf(uint32_t code) const { return prefixes_[code]; }
  // The length of the longest string in the table that begins with this one.
  uint32_t Reach(uint32_t code) const { return reaches_[code]; }

 private:
  struct Slot {
    uint32_t key;
    uint32_t code;
  };

  // At most half of the slots are ever taken, so each search ends soon.
  static constexpr uint32_t kSlotBits = 16;
  static constexpr uint32_t kSlotCount = 1u << kSlotBits;
  static constexpr uint32_t kFreeSlot = 0;

  // Never kFreeSlot.
  static uint32_t KeyOf(uint32_t prefix, uint8_t byte) { return (prefix << 8 | byte) + 1; }
  static uint32_t HomeOf(uint32_t key) { return key * 0x9E3779B1u >> (32 - kSlotBits); }

  std::vector<Slot> slots_;
  // By code. No length is above the number of entries, which fits 15 bits.
  std::array<uint16_t, kLastCode + 1> prefixes_ = {};
  std::array<uint16_t, kLastCode + 1> lengths_ = {};
  std::array<uint16_t, kLastCode + 1> reaches_ = {};
};

}  // namespace image

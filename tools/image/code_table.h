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
    for (Probe probe = ProbeFor(prefix, byte);; probe.Advance()) {
      const Slot slot = slots_[probe.index];
      if (slot == kFreeSlot) return kNoCode;
      if (slot % (1u << kTagBits) == probe.tag) return slot >> kTagBits;
    }
  }

  // Gives that string, which has no entry yet, the code `code`, at most kLastCode. Where the slots
  // are so crowded that it would be too far from its home, it is not found later.
  void Add(uint32_t prefix, uint8_t byte, uint32_t code);

  // The code of an entry's string without its last byte.
  uint32_t PrefixOf(uint32_t code) const { return prefixes_[code]; }
  // The length of the longest string in the table that begins with this one.
  uint32_t Reach(uint32_t code) const { return reaches_[code]; }

 private:
  // One word each, so that the table stays in a processor's nearer memory: the code, then what the
  // place of the slot doesn't say of the key, then how far the slot is from the key's home. At most
  // half of the slots are ever taken, so each search ends soon.
  using Slot = uint32_t;
  static constexpr Slot kFreeSlot = 0;
  static constexpr unsigned kSlotBits = 16;
  static constexpr uint32_t kSlotCount = 1u << kSlotBits;
  static constexpr unsigned kRestBits = kLastWidth + 8 - kSlotBits;
  static constexpr unsigned kDistanceBits = 32 - kLastWidth - kRestBits;
  static constexpr uint32_t kDistances = 1u << kDistanceBits;

  // A string's search: the slots from its home on, and what the slot has behind the code where it
  // is the string's.
  struct Probe {
    uint32_t index;
    uint32_t tag;
    void Advance() {
      index = (index + 1) % kSlotCount;
      ++tag;
    }
  };
  static constexpr unsigned kTagBits = kRestBits + kDistanceBits;

  // Multiplication by an odd number keeps keys of 23 bits apart.
  static Probe ProbeFor(uint32_t prefix, uint8_t byte) {
    const uint32_t mixed = (prefix << 8 | byte) * 0x9E3779B1u % (1u << (kLastWidth + 8));
    return {mixed >> kRestBits, mixed % (1u << kRestBits) << kDistanceBits};
  }

  std::vector<Slot> slots_;
  // By code. No length is above the number of entries, which fits 15 bits.
  std::array<uint16_t, kLastCode + 1> prefixes_ = {};
  std::array<uint16_t, kLastCode + 1> lengths_ = {};
  std::array<uint16_t, kLastCode + 1> reaches_ = {};
};

}  // namespace image

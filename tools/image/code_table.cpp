#include "tools/image/code_table.h"

#include <algorithm>

namespace image {

CodeTable::CodeTable() : slots_(kSlotCount) {
  Clear();
}

void CodeTable::Clear() {
  std::fill(slots_.begin(), slots_.end(), kFreeSlot);
  std::fill_n(lengths_.begin(), 256, uint16_t{1});
  std::fill_n(reaches_.begin(), 256, uint16_t{1});
}

void CodeTable::Add(uint32_t prefix, uint8_t byte, uint32_t code) {
  Probe probe = ProbeFor(prefix, byte);
  const uint32_t firstTag = probe.tag;
  while (slots_[probe.index] != kFreeSlot) probe.Advance();
  if (probe.tag - firstTag < kDistances) slots_[probe.index] = code << kTagBits | probe.tag;

  const auto length = static_cast<uint16_t>(lengths_[prefix] + 1);
  prefixes_[code] = static_cast<uint16_t>(prefix);
  lengths_[code] = reaches_[code] = length;
  for (uint32_t longer = prefix; reaches_[longer] < length; longer = prefixes_[longer]) {
    reaches_[longer] = length;
    if (longer < kFirstFreeCode) break;
  }
}

}  // namespace image

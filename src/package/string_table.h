// The strings that the codes of a stream stand for.
//
// In the format an entry is a prefix code and a suffix of one byte. Here an entry takes its
// prefix's suffix over as long as that has room and puts its own byte behind it: a suffix has up to
// 8 bytes, and a string of up to 8 is written by one copy of 8. What is in a suffix behind its
// bytes has no meaning.
#pragma once

#include <cstdint>
#include <cstring>

struct StringTable {
  static constexpr uint32_t kSize = 35023;
  static constexpr uint32_t kFirstEntry = 259;
  static constexpr uint32_t kSuffixSize = 8;

  // Entry 259 has 2 bytes, and each entry may be one byte longer than the one before it.
  static constexpr uint32_t kLongestString = kSize - kFirstEntry + 1;
  // What Append needs at its output: suffixes are written whole.
  static constexpr uint32_t kStringRoom = kLongestString + kSuffixSize - 1;

  struct Entry {
    uint8_t suffix[kSuffixSize];  // the last (length - 1) % 8 + 1 bytes of the string
    uint32_t prefix;              // code of the string in front of them, when there is one
    uint32_t length;              // of the whole string
  };

  // kSize + 1 of them, not owned; 256 to 258 are not used. The entry of nextCode is open: the
  // string of the code before and the first byte of the next code's string. Until that is known the
  // byte is the first of the entry itself, which is right when the next code is nextCode. The last
  // of all is open when the table is full.
  Entry* entries = nullptr;
  uint32_t nextCode = kFirstEntry;
  uint8_t* openByte = nullptr;  // that last byte of the open entry

  // To be called once, before any string is appended.
  void SetLiterals() {
    for (uint32_t code = 0; code <= UINT8_MAX; ++code) {
      entries[code] = {.suffix = {static_cast<uint8_t>(code)}, .prefix = 0, .length = 1};
    }
  }

  // Whether the code stands for a string. Above the open entry there may be entries from before a
  // reset. Compared unsigned: as a signed number a 32-bit code with its top bit set would look like
  // a literal.
  bool Has(uint32_t code) const {
    return (code <= UINT8_MAX || code >= kFirstEntry) && code <= nextCode;
  }

  // How many codes the table can take before it is full.
  uint32_t FreeCount() const { return kSize - nextCode; }

  // Length of the string that was appended last.
  uint32_t LastLength() const { return entries[nextCode].length - 1; }

  // Writes the string of the first code, or of the first after a reset, and opens the first entry.
  // Returns the end of the string.
  uint8_t* AppendFirst(uint8_t literal, uint8_t* output) {
    *output = literal;
    nextCode = kFirstEntry;
    OpenEntry(literal, 1, literal);
    return output + 1;
  }

  // Writes the string of a code that the table has, when the table is not full, completes the open
  // entry and opens the next. Up to 7 bytes behind the string are overwritten: `output` has room
  // for kStringRoom bytes. Returns the end of the string.
  uint8_t* Append(uint32_t code, uint8_t* output) {
    const Entry& entry = entries[code];
    const uint32_t length = entry.length;
    const uint32_t place = (length - 1) / kSuffixSize * kSuffixSize;
    memcpy(output + place, entry.suffix, kSuffixSize);
    if (place > 0) WritePrefix(entry.prefix, place, output);
    *openByte = *output;
    ++nextCode;
    OpenEntry(code, length, *output);
    return output + length;
  }

 private:
  // A prefix is older than the entry that names it, and what stands in front of a suffix is a
  // multiple of 8 bytes: so each step fills 8 bytes, and the last one the first 8.
  void WritePrefix(uint32_t prefix, uint32_t length, uint8_t* output) const {
    while (length > 0) {
      length -= kSuffixSize;
      memcpy(output + length, entries[prefix].suffix, kSuffixSize);
      prefix = entries[prefix].prefix;
    }
  }

  // `length` and `firstByte` are those of the code's string.
  void OpenEntry(uint32_t code, uint32_t length, uint8_t firstByte) {
    const Entry& entry = entries[code];
    Entry& open = entries[nextCode];
    const uint32_t used = length % kSuffixSize;
    const uint32_t prefix = entry.prefix;  // read in any case: a branch on `used` costs more
    memcpy(open.suffix, entry.suffix, kSuffixSize);
    open.prefix = used == 0 ? code : prefix;
    open.length = length + 1;
    openByte = open.suffix + used;
    *openByte = firstByte;
  }
};

// Expands a stream, plainly and with every check: it refuses just what the setup program's own
// expander refuses. A stream has no end mark and no length of its output; it ends with its bytes.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace image {

class StreamReader {
 public:
  // Fills the front of the bytes given and says how many; 0 at the end of the stream.
  using Source = std::function<size_t(std::span<uint8_t>)>;

  explicit StreamReader(Source source);

  // The next piece of the output, valid until the next call; empty when the stream has ended or is
  // bad.
  std::span<const uint8_t> Next();
  // What is wrong with the stream, "" as long as nothing is.
  const std::string& Fault() const { return fault_; }

 private:
  struct Entry {
    uint32_t prefix;  // code of the string without its last byte
    uint8_t suffix;   // the last byte
  };

  std::optional<uint8_t> ReadByte();
  std::optional<uint32_t> ReadCode();
  void ReadMagic();
  std::span<const uint8_t> StartWith(uint32_t code);
  void BuildString(uint32_t code);
  std::span<const uint8_t> Fail(const std::string& fault);

  Source source_;
  std::string fault_;
  std::vector<uint8_t> block_;
  size_t blockUsed_ = 0;
  size_t blockFill_ = 0;

  uint64_t bits_ = 0;  // the last bitCount_ bits are not yet read as codes
  unsigned bitCount_ = 0;
  unsigned width_;

  std::vector<Entry> entries_;
  std::vector<uint8_t> string_;
  uint32_t nextCode_;
  uint32_t previousCode_ = 0;
  uint8_t firstByte_ = 0;  // of the string of previousCode_
  bool magicSeen_ = false;
  bool atStart_ = true;  // the next code is the first, of the stream or after a reset
};

}  // namespace image

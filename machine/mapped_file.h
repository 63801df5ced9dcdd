// Files of the host, mapped into memory.
#pragma once

#include <cstdint>
#include <filesystem>
#include <span>

namespace machine {

// A regular file mapped into memory, for a reader of a few places in a large one: only the pages
// that are looked at are read.
class MappedFile {
 public:
  explicit MappedFile(const std::filesystem::path& file);
  ~MappedFile();
  MappedFile(const MappedFile&) = delete;
  MappedFile& operator=(const MappedFile&) = delete;

  // Empty for an empty file and for one that is none or can't be read.
  std::span<const uint8_t> bytes() const { return bytes_; }

 private:
  std::span<const uint8_t> bytes_;
};

}  // namespace machine

// Files of the host.
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <span>
#include <vector>

namespace machine {

// The bytes of a regular file; nullopt when it is none or can't be read.
std::optional<std::vector<uint8_t>> ReadHostFile(const std::filesystem::path& file);

// A regular file mapped into memory, for a reader of a few places in a large one: only the pages
// that are looked at are read.
class MappedHostFile {
 public:
  explicit MappedHostFile(const std::filesystem::path& file);
  ~MappedHostFile();
  MappedHostFile(const MappedHostFile&) = delete;
  MappedHostFile& operator=(const MappedHostFile&) = delete;

  // Empty for an empty file and for one that is none or can't be read.
  std::span<const uint8_t> bytes() const { return bytes_; }

 private:
  std::span<const uint8_t> bytes_;
};

}  // namespace machine

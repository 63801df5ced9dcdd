// A plain file on the host, open for reading at any place.
#pragma once

#include <cstdint>
#include <filesystem>
#include <span>
#include <vector>

namespace image {

class InputFile {
 public:
  // Throws BadInput when there is no such file or it is none that can be read.
  explicit InputFile(const std::filesystem::path& path);
  ~InputFile();
  InputFile(const InputFile&) = delete;
  InputFile& operator=(const InputFile&) = delete;

  const std::filesystem::path& Path() const { return path_; }
  // Bytes, as they were when the file was opened.
  uint64_t Size() const { return size_; }

  // Fills `bytes` from `offset` on. Throws BadInput when the file does not hold them all.
  void Read(uint64_t offset, std::span<uint8_t> bytes) const;

 private:
  std::filesystem::path path_;
  int descriptor_ = -1;
  uint64_t size_ = 0;
};

// The file as a whole. Throws BadInput when it has more than `limit` bytes.
std::vector<uint8_t> ReadWholeFile(const std::filesystem::path& path, uint64_t limit);

}  // namespace image

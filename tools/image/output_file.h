// A file in the making. It is written under a temporary name in its own folder and takes its real
// name only by Commit, so that nothing half-written is ever met under that name.
#pragma once

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <span>
#include <system_error>

#include "tools/image/host_files.h"

namespace image {

class OutputFile {
 public:
  // Throws BadInput when nothing can be written there, or when something stands under that name
  // that is no plain file.
  OutputFile(const std::filesystem::path& target, FileKind kind);
  // Without a Commit the temporary file goes.
  ~OutputFile();
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;

  const std::filesystem::path& Target() const { return target_; }
  // Where the bytes are before Commit.
  const std::filesystem::path& Temporary() const { return temporary_; }

  void Write(std::span<const uint8_t> bytes);
  // The last bytes reach the disk's care; nothing can be written after it.
  void Close();
  // Closes, and puts the file under its name in place of what stands there.
  void Commit();

 private:
  [[noreturn]] void Fail(const std::error_code& error) const;

  std::filesystem::path target_;
  std::filesystem::path temporary_;
  std::FILE* file_ = nullptr;
  bool committed_ = false;
};

}  // namespace image

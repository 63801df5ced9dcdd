// A new folder among the host's temporary files, which is gone with the processes that may use it,
// however they end.
#pragma once

#include <sys/types.h>

#include <filesystem>

namespace image {

class ThrowawayFolder {
 public:
  // Throws std::runtime_error when there can be none.
  ThrowawayFolder();
  // Waits until the folder is gone: no process that this one has made since may be left.
  ~ThrowawayFolder();
  ThrowawayFolder(const ThrowawayFolder&) = delete;
  ThrowawayFolder& operator=(const ThrowawayFolder&) = delete;

  const std::filesystem::path& Path() const { return path_; }

 private:
  std::filesystem::path path_;
  pid_t keeper_ = -1;
  int end_ = -1;
};

}  // namespace image

#include "tools/image/input_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "tools/image/bad_input.h"

namespace image {

InputFile::InputFile(const std::filesystem::path& path) : path_(path) {
  // Without O_NONBLOCK the open of a pipe that nobody writes to would wait for ever.
  descriptor_ = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
  if (descriptor_ < 0) throw BadInput(path, "can't be opened: " + SystemReason(errno));
  struct stat status {};
  if (fstat(descriptor_, &status) != 0 || !S_ISREG(status.st_mode)) {
    close(descriptor_);
    throw BadInput(path, "is not a plain file; name one");
  }
  size_ = static_cast<uint64_t>(status.st_size);
}

InputFile::~InputFile() {
  close(descriptor_);
}

void InputFile::Read(uint64_t offset, std::span<uint8_t> bytes) const {
  if (offset > size_ || bytes.size() > size_ - offset) {
    throw BadInput(path_, "ends before offset " + std::to_string(offset) + " plus " +
                              std::to_string(bytes.size()) + " bytes; it is cut or damaged");
  }
  while (!bytes.empty()) {
    const ssize_t count =
        pread(descriptor_, bytes.data(), bytes.size(), static_cast<off_t>(offset));
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) throw BadInput(path_, "can't be read: " + SystemReason(errno));
    if (count == 0) throw BadInput(path_, "became shorter while it was read; try again");
    bytes = bytes.subspan(static_cast<size_t>(count));
    offset += static_cast<uint64_t>(count);
  }
}

std::vector<uint8_t> ReadWholeFile(const std::filesystem::path& path, uint64_t limit) {
  const InputFile file(path);
  if (file.Size() > limit) {
    throw BadInput(path, "has " + std::to_string(file.Size()) + " bytes; at most " +
                             std::to_string(limit) + " can be taken");
  }
  std::vector<uint8_t> bytes(static_cast<size_t>(file.Size()));
  file.Read(0, bytes);
  return bytes;
}

}  // namespace image

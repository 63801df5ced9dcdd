#include "tools/image/input_file.h"

#include <optional>

#include "tools/image/bad_input.h"
#include "tools/image/host_files.h"

namespace image {

InputFile::InputFile(const std::filesystem::path& path) : path_(path) {
  descriptor_ = OpenFile(path);
  if (descriptor_ < 0) throw BadInput(path, "can't be opened: " + SystemReason(LastCallError()));
  const std::optional<uint64_t> size = SizeOfPlainFile(descriptor_);
  if (!size) {
    CloseFile(descriptor_);
    throw BadInput(path, "is not a plain file; name one");
  }
  size_ = *size;
}

InputFile::~InputFile() {
  CloseFile(descriptor_);
}

void InputFile::Read(uint64_t offset, std::span<uint8_t> bytes) const {
  if (offset > size_ || bytes.size() > size_ - offset) {
    throw BadInput(path_, "ends before offset " + std::to_string(offset) + " plus " +
                              std::to_string(bytes.size()) + " bytes; it is cut or damaged");
  }
  while (!bytes.empty()) {
    const int64_t count = ReadAt(descriptor_, offset, bytes);
    if (count < 0) throw BadInput(path_, "can't be read: " + SystemReason(LastCallError()));
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

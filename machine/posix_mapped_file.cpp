#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include "machine/mapped_file.h"

namespace machine {

MappedFile::MappedFile(const std::filesystem::path& file) {
  const int descriptor = open(file.c_str(), O_RDONLY | O_CLOEXEC);
  if (descriptor == -1) return;
  struct stat status = {};
  if (fstat(descriptor, &status) == 0 && S_ISREG(status.st_mode) && status.st_size > 0) {
    const size_t size = static_cast<size_t>(status.st_size);
    void* const start = mmap(nullptr, size, PROT_READ, MAP_PRIVATE, descriptor, 0);
    if (start != MAP_FAILED) bytes_ = {static_cast<const uint8_t*>(start), size};
  }
  close(descriptor);
}

MappedFile::~MappedFile() {
  if (!bytes_.empty()) munmap(const_cast<uint8_t*>(bytes_.data()), bytes_.size());
}

}  // namespace machine

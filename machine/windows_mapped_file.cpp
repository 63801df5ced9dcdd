#include <windows.h>

#include "machine/mapped_file.h"

namespace machine {

MappedFile::MappedFile(const std::filesystem::path& file) {
  const HANDLE opened = CreateFileW(file.c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr,
                                    OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (opened == INVALID_HANDLE_VALUE) return;
  LARGE_INTEGER size = {};
  // An empty file can't be mapped, and what is no file of a disk neither.
  const HANDLE mapping = CreateFileMappingW(opened, nullptr, PAGE_READONLY, 0, 0, nullptr);
  if (mapping != nullptr && GetFileSizeEx(opened, &size) != FALSE) {
    const void* const start = MapViewOfFile(mapping, FILE_MAP_READ, 0, 0, 0);
    if (start != nullptr) {
      bytes_ = {static_cast<const uint8_t*>(start), static_cast<size_t>(size.QuadPart)};
    }
  }
  if (mapping != nullptr) CloseHandle(mapping);
  CloseHandle(opened);
}

MappedFile::~MappedFile() {
  if (!bytes_.empty()) UnmapViewOfFile(bytes_.data());
}

}  // namespace machine

#include "engine/target_list.h"

#include <new>

StatusCode AddTarget(TargetList* list, const char* path, const char* directory) {
  if (list == nullptr || path == nullptr) return StatusBadArgument;
  const int32_t oldCount = list->entries != nullptr && list->count > 0 ? list->count : 0;
  TargetEntry* entries = new (std::nothrow) TargetEntry[static_cast<size_t>(oldCount) + 1]();
  if (entries == nullptr) return StatusNoMemory;
  TargetEntry* added = &entries[oldCount];
  if (!CopyText(added->path, path) ||
      (directory != nullptr && !CopyText(added->directory, directory))) {
    delete[] entries;
    return StatusBufferTooSmall;
  }
  for (int32_t i = 0; i < oldCount; ++i) entries[i] = list->entries[i];
  delete[] list->entries;
  list->entries = entries;
  list->count = oldCount + 1;
  return StatusOk;
}

void FreeTargets(TargetList* list) {
  delete[] list->entries;
  list->entries = nullptr;
  list->count = 0;
}

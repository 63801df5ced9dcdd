// Where one record's file goes on this machine.
#pragma once

#include <cstdint>

#include "core/status.h"
#include "platform/text.h"

struct TargetEntry {
  char path[kPathSize];       // full path of the file
  char directory[kPathSize];  // what the element's subpath names, in full; empty without a subpath
                              // and for an absolute directory
};

// A counted array in the order of the destination's elements. An empty list has none (null);
// whoever has the list frees it.
struct TargetList {
  int32_t count;
  TargetEntry* entries;
};

// Appends one entry; `directory` may be null. Returns 1, StatusBadArgument for a null list or path,
// StatusBufferTooSmall for a text above 259 characters, StatusNoMemory; the list is unchanged then.
StatusCode AddTarget(TargetList* list, const char* path, const char* directory);

// Frees the entries; the list is empty afterwards.
void FreeTargets(TargetList* list);

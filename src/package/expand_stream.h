// Expands one packaged stream into a file.
#pragma once

#include <cstdint>

#include "core/status.h"
#include "package/data_file.h"

// Expands the `storedSize` bytes at the package file's position into a new file at `path`. The user
// can stop it at each 1024 stored bytes. Adds no events.
// Returns 1 with the file made and the position behind the stream. Without making one, so that a
// file at the path stays: StatusInternal for a missing file or path or a size of 0, StatusNoMemory,
// StatusCreateFileFailed. After making one, which is deleted again if the system lets it go:
// StatusNoMemory, StatusCancelled, StatusReadFailed, StatusExpandFailed (bad data, or the disk took
// less than all). Nobody counts the expanded bytes: a stream may end early.
StatusCode ExpandStream(DataFile* packageFile, const char* path, uint32_t storedSize);

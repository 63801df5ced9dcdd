// The removal program, which an install leaves in the Windows directory: the running image without
// its streams, and marked in its header as one that removes.
#pragma once

#include <cstdint>

#include "core/context.h"

// Room for its full path: a directory and a name.
inline constexpr size_t kRemovalProgramPathSize = 2 * kPathSize;

// Its full path. False, with the path of no use, when the system names no Windows directory or the
// catalog no program.
bool FindRemovalProgramPath(char (&path)[kRemovalProgramPathSize]);

// Writes it, in place of an earlier one. Needs packageFile, and records as an install pass leaves
// them; changes records and header in memory into those of the removal program.
//   path  where its full path goes, also for a failure behind that point; may be null. One that
//         doesn't fit in `size` bytes leaves the buffer alone.
// Returns 1, or: StatusBadArgument; StatusBadRecord when the running image has no path or no
// version resource with a translation and a file version; StatusDeleteFailed for an earlier one
// that can't go; StatusOpenFailed, StatusNoMemory, StatusCreateFileFailed;
// StatusWriteRemovalFailed, also when there is no path for it. No partial file stays. Adds no
// events.
StatusCode WriteRemovalProgram(SetupContext* context, char* path, int32_t size);

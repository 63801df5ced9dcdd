// Puts the packaged files on the disk: each stream is expanded once, into the record's first
// target, and copied from there to the others. A file in the way is deleted, whatever its version.
// A pass that gives up takes nothing back but the file that it was expanding.
#pragma once

#include "core/context.h"
#include "engine/target_list.h"

// The pass. Needs an open package, a settled installDir and null records; called once a run. Leaves
// all records in context->records, which the removal program is written from.
// Returns 1 when all is done. Else a fatal event has been added, but for a missing argument, a stop
// by the user before a record and a stored size of 0. StatusSeekFailed, and StatusNoMemory for the
// records, leave the package closed.
StatusCode InstallFiles(SetupContext* context);

// Writes all targets of one record. The package file stands at the record's stream, and after
// success behind it. Adds event 34 for each target. Returns 1, StatusInternal for a missing
// argument or a size of 0, or the failure of the target at which it stopped, with fatal event 28,
// 29, 33 or 37; those before it stay.
StatusCode InstallTargets(SetupContext* context, const TargetList* list, uint32_t storedSize);

// Copies over what is there. Returns 1, StatusCopyFailed, or StatusInternal when a path is null or
// empty.
StatusCode CopyTarget(const char* source, const char* target);

// Makes the directories on the way to a file, as far as they are missing. A path that begins with a
// backslash has none that can be made. Returns 1, StatusCreateDirFailed, or StatusInternal for a
// missing path or one below 4 characters.
StatusCode MakeDirectories(const char* path);

// Finds and reads the package at the tail of the program's own image.
//
// The image is read from its end, so the program works under any file name; it is never loaded
// whole. docs/package-format.md has the format.
#pragma once

#include "core/context.h"
#include "package/data_file.h"

// Opens the image and fills context->header. The event list begins anew, and is not freed before:
// it has to be empty, and the package closed.
// Returns 1 and leaves packageFile open. Else it is null: StatusBadPackage (also for a null
// context), StatusOpenFailed, StatusInternal, StatusNoMemory. Adds one fatal event for each failure
// but a null context and StatusNoMemory.
StatusCode OpenPackage(SetupContext* context);

// The same without the event list.
StatusCode ReadPackageHeader(SetupContext* context);

// Reads the record at the file's position into `record`. Returns 696, 0 when the read falls short
// or the record is none, StatusBadArgument for a null argument.
int32_t ReadFileRecord(DataFile* file, FileRecord* record);

// Full path of the running image. Returns 1, StatusBadArgument for a buffer that is null or empty,
// or StatusNoModulePath, with an empty text, when the system gives none or it doesn't fit.
StatusCode GetImagePath(char* buffer, uint32_t size);

// Closes and destroys packageFile, frees records, sets both to null. Returns 1, or
// StatusBadArgument for a null context.
StatusCode ReleasePackage(SetupContext* context);

// Closes and destroys packageFile, if it is set, and sets it to null; records stay.
void ClosePackageFile(SetupContext* context);

// Ends a run's record: frees the events and releases the package, which may never have been open.
// It stands here and not beside the record since it destroys the DataFile.
// Returns 1, or StatusBadArgument for a null context.
StatusCode CloseSetup(SetupContext* context);

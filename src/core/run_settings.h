// What a run has to know before it begins to work, silent or not: language, installed product,
// directory, disk space.
#pragma once

#include "core/context.h"

// Settles language, header.defaultLanguage and currentLanguage: the command line's, else the
// registered product's, else the package's, else the system's. Needs the package open. Returns 1,
// or StatusBadArgument for a null context.
StatusCode ChooseLanguage(SetupContext* context);

// Sets productFound; puts the registered directory, or else one that exists (installDir, then the
// default), in installDir, with event 1 or 2. Returns 1, also when nothing was found, or
// StatusBadArgument for a null context.
StatusCode FindInstalledProduct(SetupContext* context);

// Makes the directory text valid, in place: itself, else the given default, which may be null and
// is not tested, else the catalog's. Returns 1; StatusBadArgument without a buffer;
// -1 when the catalog's default doesn't fit; StatusBadDirectory when it is no path.
StatusCode ChooseInstallDir(const SetupContext* context, char* directory, size_t size,
                            const char* defaultDirectory);

// The catalog's default directory, empty when the catalog can't be read. Returns 1; -1 when there
// is no buffer or it is too small.
int GetDefaultInstallDir(const SetupContext* context, char* buffer, size_t size);

// Whether the drive of installDir can take what the package needs: 1, as long as nothing is known
// against it, or StatusNoDiskSpace. StatusBadArgument for a null context.
StatusCode CheckDiskSpace(const SetupContext* context);

// Free bytes, available to the caller, on the drive of the path. False when that is unknown, as for
// a path without a backslash.
bool GetFreeDiskSpace(const char* path, uint64_t* bytes);

// Bytes that the package needs; 0 when it can't be opened, and for a null context. A package that
// is closed is opened for the look and ended with CloseSetup, also when it could not be opened:
// events and records that the context held are gone then.
uint32_t GetNeededSpace(SetupContext* context);

// Whether the text can be an installation directory: 1 or 0. Cuts trailing blanks in place. Only
// what stands behind the first ":" is tested, so that a relative path passes.
int IsValidPath(char* path);

// Whether the set has the character: 1 or 0; -1 for a character 0 and for a null or empty set.
int CharInSet(char character, const char* set);

// Megabytes, cut to one decimal behind a comma in every language; a zero decimal isn't shown.
// Returns 1, or 0 with the buffer unchanged for a null buffer or one that is too small.
int FormatSize(uint32_t bytes, char* buffer, size_t size);

// The few operations on paths and on the program's own module that all the passes share. Truth
// values are 1 and 0. A path may be null or empty: then the answer is 0 unless told.
#pragma once

#include <cstddef>

#include "core/status.h"
#include "platform/win32.h"

// Something stands at the path, and it is no directory / a directory.
int FileExists(const char* path);
int DirectoryExists(const char* path);

// Delete a file, or a directory if it is empty. Return 1 or 0; StatusBadArgument for a null or
// empty path.
StatusCode DeleteFileChecked(const char* path);
StatusCode RemoveDirectoryChecked(const char* path);

// Puts a backslash behind a text that has none there. Returns 1 if it did; 0 also for an empty text
// and a full buffer.
int AppendBackslash(char* text, size_t size);
template <size_t N>
int AppendBackslash(char (&text)[N]) {
  return AppendBackslash(text, N);
}

// Copies the Windows directory. The system's first good answer is kept for the life of the process;
// until then each call asks anew. Returns 0, with the buffer unchanged, when there is none or it
// doesn't fit.
int GetWindowsDir(char* buffer, size_t size);

// The program's own module; the resources are in it.
HINSTANCE ModuleHandle();

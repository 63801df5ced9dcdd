// Where, on this machine, the browsers keep their plug-ins. The registry alone is asked, anew at
// each call; nothing is logged or changed.
#pragma once

#include <cstdint>

#include "platform/win32.h"

// Fill the buffer (size in bytes) with the browser's plug-in directory, which has no guaranteed
// backslash at its end and need not exist. Return 1, or 0 with the buffer unchanged: the browser is
// not there, or its directory doesn't fit.
int FindNetscapePluginDir(char* buffer, int32_t size);
int FindExplorerPluginDir(char* buffer, int32_t size);
int FindOperaPluginDir(char* buffer, int32_t size);

// Reads a value as text, whatever its type. `count` holds the buffer's size and receives the bytes
// stored. Returns 1, or 0 for a missing argument, an absent value, one longer than the buffer, and
// one that fills it without a NUL. The caller clears the buffer first: a shorter value need not end
// in a NUL of its own.
int ReadRegistryValue(HKEY root, const char* subkey, const char* name, char* data, DWORD* count);

// Reduces the text of a "Path" value to its first directory, in place. Returns 1, or 0 with the
// text unchanged when that directory doesn't exist.
int CleanAppPath(char* path);

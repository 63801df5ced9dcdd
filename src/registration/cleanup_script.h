// "Moriv.INF", a file that goes into the Windows directory: it tells the system's INF installer to
// delete the removal program, the log and itself.
#pragma once

#include <cstddef>

// The section that the installer has to process.
inline constexpr char kCleanupSection[] = "Uninstall";

// Writes the file in place of an earlier one, and gives its full path as soon as that is known.
// Returns 1, or 0 when there is no Windows directory, its path doesn't fit, or the file can't be
// made or written whole; what was written then stays.
int WriteCleanupScript(char* path, size_t size);

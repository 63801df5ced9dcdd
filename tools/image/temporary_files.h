// The files that are being written under another name, so that an interrupted tool leaves none.
#pragma once

#include <cstdio>
#include <filesystem>

#include "tools/image/host_files.h"

namespace image {

// Makes an empty file in a folder, open for writing, and gives its path. nullptr with errno.
std::FILE* MakeTemporaryFile(const std::filesystem::path& folder, FileKind kind,
                             std::filesystem::path* path);
// It has got its own name, or has been deleted.
void ForgetTemporaryFile(const std::filesystem::path& path);

// From now on a process that is told to end deletes these files first: by Ctrl-C and its like, on
// Linux by SIGTERM, SIGHUP, SIGQUIT and SIGPIPE unless they are ignored. To be called once, before
// the process has a second thread.
void DeleteTemporaryFilesWhenStopped();

}  // namespace image

// The files that are being written under another name, so that an interrupted tool leaves none.
#pragma once

#include <string>

namespace image {

// Makes an empty file, open for reading and writing; `name` ends in XXXXXX, which becomes what
// makes it unique. Returns its descriptor, or -1 with errno.
int MakeTemporaryFile(std::string* name);
// It has got its own name, or has been deleted.
void ForgetTemporaryFile(const std::string& name);

// From now on SIGINT, SIGTERM and SIGHUP, but those that are ignored, delete these files before
// they end the process. To be called once, before the process has a second thread.
void DeleteTemporaryFilesOnSignal();

}  // namespace image

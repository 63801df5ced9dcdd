// Handles of the processes and threads that the program has started. Nothing can be done with one
// but to close it.
#pragma once

#include "platform/win32.h"

namespace machine {

HANDLE OpenProcessHandle();
// False for a handle that is none of these.
bool CloseProcessHandle(HANDLE handle);

}  // namespace machine

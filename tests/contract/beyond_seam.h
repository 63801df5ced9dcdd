// What a case needs of its world beyond the functions of the seam.
#pragma once

#include <string>

#include "platform/win32.h"

namespace contract {

#ifdef _WIN32
// A user who answers the next box or picker of this thread, as soon as all that was posted before
// is through: picks the folder, if one is named, and presses the button.
void AnswerNext(int button, const std::string& folder = "");

void WaitForEnd(HANDLE process);
#else
// The user is the script contract.user. Programs don't really start.
inline void AnswerNext(int, const std::string& = "") {}
inline void WaitForEnd(HANDLE) {}
#endif

}  // namespace contract

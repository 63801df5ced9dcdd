// Injected faults: the n-th call of a function of the seam fails, or ends the process.
#pragma once

#include <vector>

#include "machine/settings.h"

namespace machine {

// Replaces all faults and sets every function's count of calls to 0.
void SetFaults(const std::vector<Fault>& faults);

// Counts one call of `function` and asks whether it is to fail; every function of the seam begins
// with this question, so that only the program's own calls count. When the answer is true,
// `error` (may be null) holds the Windows error number. A `stop` fault does not return: the process
// ends at once, with nothing flushed or closed, as if the power went, with exit status 4.
bool CallFails(const char* function, DWORD* error = nullptr);

// Calls of `function` so far.
int CallCount(const char* function);

}  // namespace machine

// Injected faults: the n-th call of a function of the seam fails, falls short, or ends the process.
#pragma once

#include <functional>
#include <vector>

#include "machine/settings.h"

namespace machine {

// Replaces all faults and sets every function's count of calls to 0. `observer` (may be empty) is
// called with each fault that strikes, ahead of its effect.
void SetFaults(const std::vector<Fault>& faults, std::function<void(const Fault&)> observer = {});

// Counts one call of `function` and asks whether it is to fail; every function of the seam begins
// with this question, so that only the program's own calls count. When the answer is true,
// `error` (may be null) holds the Windows error number. A `stop` fault does not return: the process
// ends at once, with nothing flushed or closed, as if the power went, with exit status 4. One that
// is short as well ends it at the next call of the seam.
bool CallFails(const char* function, DWORD* error = nullptr);

// The same for a function that moves `*count` bytes: a `short` fault halves them, and the call goes
// on with what is left.
bool TransferFails(const char* function, DWORD* count);

// Calls of `function` so far.
int CallCount(const char* function);

}  // namespace machine

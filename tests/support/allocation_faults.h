// Allocations that fail: the program takes all its memory through the nothrow forms of new.
#pragma once

#include <functional>

// The n-th allocation from now on fails, counted from 1, once or with all later ones. `observer`
// (may be empty) is called each time.
void FailAllocation(int call, bool fromThenOn = false, std::function<void()> observer = {});

// Withdraws a failure that was ordered; true when it has not happened.
bool WithdrawAllocationFailure();

// Blocks that were allocated in this way and not yet freed.
int LiveAllocations();

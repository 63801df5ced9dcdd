// Allocations that fail: the program takes all its memory through the nothrow forms of new.
#pragma once

// The n-th allocation from now on fails, counted from 1, once.
void FailAllocation(int call);

// Withdraws a failure that was ordered; true when it has not happened.
bool WithdrawAllocationFailure();

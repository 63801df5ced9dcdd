#include "tests/support/allocation_faults.h"

#include <new>
#include <utility>

namespace {

int failingCall = 0;  // counts down; 0: none fails

bool IsFailingCall() {
  return failingCall > 0 && --failingCall == 0;
}

}  // namespace

void FailAllocation(int call) {
  failingCall = call;
}

bool WithdrawAllocationFailure() {
  return std::exchange(failingCall, 0) != 0;
}

void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  if (IsFailingCall()) return nullptr;
  try {
    return ::operator new(size);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
  if (IsFailingCall()) return nullptr;
  try {
    return ::operator new[](size);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

#include "tests/support/allocation_faults.h"

#include <algorithm>
#include <cstdlib>
#include <new>
#include <utility>

namespace {

int callsToFailure = 0;  // 1: the next one fails; 0: none does
bool failsFromThenOn = false;
bool hasFailed = false;
std::function<void()> failureObserver;

// Few blocks live at a time, so that a list is searched fast enough at every delete.
constexpr int kMostBlocks = 4096;
void* liveBlocks[kMostBlocks];
int liveCount = 0;

bool IsFailingCall() {
  if (callsToFailure == 0 || --callsToFailure > 0) return false;
  hasFailed = true;
  callsToFailure = failsFromThenOn ? 1 : 0;
  if (failureObserver) failureObserver();
  return true;
}

void* Allocate(std::size_t size) {
  void* const block = std::malloc(size != 0 ? size : 1);
  if (block == nullptr) throw std::bad_alloc();
  return block;
}

void* AllocateCounted(std::size_t size) {
  if (IsFailingCall() || liveCount == kMostBlocks) return nullptr;
  return liveBlocks[liveCount++] = Allocate(size);
}

void Free(void* block) {
  void** const end = liveBlocks + liveCount;
  void** const found = std::find(liveBlocks, end, block);
  if (found != end && block != nullptr) *found = liveBlocks[--liveCount];
  std::free(block);
}

}  // namespace

void FailAllocation(int call, bool fromThenOn, std::function<void()> observer) {
  failureObserver = std::move(observer);
  failsFromThenOn = fromThenOn;
  hasFailed = false;
  callsToFailure = call;
}

bool WithdrawAllocationFailure() {
  callsToFailure = 0;
  return !hasFailed;
}

int LiveAllocations() {
  return liveCount;
}

void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return AllocateCounted(size);
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
  return AllocateCounted(size);
}
void* operator new(std::size_t size) {
  return Allocate(size);
}
void* operator new[](std::size_t size) {
  return Allocate(size);
}
void operator delete(void* block) noexcept {
  Free(block);
}
void operator delete[](void* block) noexcept {
  Free(block);
}
void operator delete(void* block, std::size_t) noexcept {
  Free(block);
}
void operator delete[](void* block, std::size_t) noexcept {
  Free(block);
}

#include "machine/faults.h"

#include <unistd.h>

#include <map>
#include <string>
#include <string_view>
#include <utility>

namespace machine {
namespace {

constexpr int kStopStatus = 4;

std::vector<Fault> currentFaults;
std::function<void(const Fault&)> strikeObserver;
std::map<std::string, int, std::less<>> callCounts;
bool endsAtNextCall = false;

bool Strikes(const Fault& fault, std::string_view function, int call) {
  return fault.function == function &&
         (call == fault.call || (fault.fromThenOn && call > fault.call));
}

// Counts the call. Returns the fault that strikes it, or null.
const Fault* CountCall(const char* function) {
  if (endsAtNextCall) _exit(kStopStatus);
  const int call = ++callCounts[function];
  for (const Fault& fault : currentFaults) {
    if (!Strikes(fault, function, call)) continue;
    if (strikeObserver) strikeObserver(fault);
    if (fault.stop && !fault.isShort) _exit(kStopStatus);
    endsAtNextCall = fault.stop;
    return &fault;
  }
  return nullptr;
}

}  // namespace

void SetFaults(const std::vector<Fault>& newFaults, std::function<void(const Fault&)> observer) {
  currentFaults = newFaults;
  strikeObserver = std::move(observer);
  callCounts.clear();
  endsAtNextCall = false;
}

bool CallFails(const char* function, DWORD* error) {
  const Fault* const fault = CountCall(function);
  if (fault != nullptr && error != nullptr) *error = fault->error;
  return fault != nullptr;
}

bool TransferFails(const char* function, DWORD* count) {
  const Fault* const fault = CountCall(function);
  if (fault != nullptr && fault->isShort) *count /= 2;
  return fault != nullptr && !fault->isShort;
}

int CallCount(const char* function) {
  const auto count = callCounts.find(std::string_view(function));
  return count == callCounts.end() ? 0 : count->second;
}

}  // namespace machine

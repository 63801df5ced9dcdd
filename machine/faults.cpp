#include "machine/faults.h"

#include <unistd.h>

#include <map>
#include <string>
#include <string_view>

namespace machine {
namespace {

constexpr int kStopStatus = 4;

std::vector<Fault> faults;
std::map<std::string, int, std::less<>> callCounts;

bool Strikes(const Fault& fault, std::string_view function, int call) {
  return fault.function == function &&
         (call == fault.call || (fault.fromThenOn && call > fault.call));
}

}  // namespace

void SetFaults(const std::vector<Fault>& newFaults) {
  faults = newFaults;
  callCounts.clear();
}

bool CallFails(const char* function, DWORD* error) {
  const int call = ++callCounts[function];
  for (const Fault& fault : faults) {
    if (!Strikes(fault, function, call)) continue;
    if (fault.stop) _exit(kStopStatus);
    if (error != nullptr) *error = fault.error;
    return true;
  }
  return false;
}

int CallCount(const char* function) {
  const auto count = callCounts.find(std::string_view(function));
  return count == callCounts.end() ? 0 : count->second;
}

}  // namespace machine

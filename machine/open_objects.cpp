#include "machine/open_objects.h"

#include <cassert>
#include <cstddef>

namespace machine {
namespace {

// In the order of ObjectKind.
constexpr const char* kObjectNames[] = {"file",           "descriptor", "key",           "module",
                                        "memory block",   "brush",      "font",          "bitmap",
                                        "device context", "item list",  "process handle"};
constexpr size_t kObjectKinds = sizeof kObjectNames / sizeof kObjectNames[0];
static_assert(static_cast<size_t>(ObjectKind::kProcess) + 1 == kObjectKinds);

int openCounts[kObjectKinds];

}  // namespace

void ObjectOpened(ObjectKind kind) {
  ++openCounts[static_cast<size_t>(kind)];
}

void ObjectClosed(ObjectKind kind) {
  int& count = openCounts[static_cast<size_t>(kind)];
  assert(count > 0);
  --count;
}

std::string OpenObjects() {
  std::string text;
  for (size_t kind = 0; kind < kObjectKinds; ++kind) {
    const int count = openCounts[kind];
    if (count == 0) continue;
    if (!text.empty()) text += ", ";
    text += std::to_string(count) + ' ' + kObjectNames[kind];
    if (count != 1) text += 's';
  }
  return text;
}

void ForgetOpenObjects() {
  for (int& count : openCounts) count = 0;
}

}  // namespace machine

#include "machine/process_handles.h"

#include <set>

#include "machine/open_objects.h"

namespace machine {
namespace {

std::set<HANDLE> openHandles;
uintptr_t lastProcessHandle = 0x30000;  // above the numbers of open files

}  // namespace

HANDLE OpenProcessHandle() {
  const HANDLE handle = reinterpret_cast<HANDLE>(lastProcessHandle += 4);
  openHandles.insert(handle);
  ObjectOpened(ObjectKind::kProcess);
  return handle;
}

bool CloseProcessHandle(HANDLE handle) {
  if (openHandles.erase(handle) == 0) return false;
  ObjectClosed(ObjectKind::kProcess);
  return true;
}

}  // namespace machine

// What the driver does inside the process of the program that it drives.
#pragma once

#include <windows.h>
// After windows.h.
#include <string>

// Calls `use` with the address, in that process's own memory, of a copy of these bytes.
template <typename Use>
void WithCopyIn(HANDLE process, const void* bytes, size_t size, Use use) {
  void* const place =
      VirtualAllocEx(process, nullptr, size, MEM_COMMIT | MEM_RESERVE, PAGE_READWRITE);
  WriteProcessMemory(process, place, bytes, size, nullptr);
  use(place);
  VirtualFreeEx(process, place, 0, MEM_RELEASE);
}

// Has the process load a library, as anything does that runs in it and knows a library's name.
// kernel32 lies at the same address in all processes.
inline void LoadLibraryIn(HANDLE process, const std::string& name) {
  WithCopyIn(process, name.c_str(), name.size() + 1, [process](void* place) {
    const auto load =
        reinterpret_cast<LPTHREAD_START_ROUTINE>(reinterpret_cast<void*>(LoadLibraryA));
    const HANDLE thread = CreateRemoteThread(process, nullptr, 0, load, place, 0, nullptr);
    WaitForSingleObject(thread, 10000);
    CloseHandle(thread);
  });
}

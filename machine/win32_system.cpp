// The system's directories, version, language and clock, and memory blocks.
#include <cstdio>
#include <cstring>
#include <ctime>
#include <map>
#include <memory>
#include <new>
#include <string>
#include <utility>

#include "machine/faults.h"
#include "machine/machine.h"
#include "machine/open_objects.h"
#include "platform/win32.h"

namespace {

constexpr UINT kZeroed = 0x40;
constexpr int kUnsetByte = 0xCD;
constexpr SIZE_T kMaxBlockSize = 0x7FFFFFFF;  // what a 32-bit process could have at the very most

struct MemoryBlock {
  std::unique_ptr<uint8_t[]> bytes;  // null for a size of 0: Windows calls it discarded
  bool isMovable = false;
  int locks = 0;
};

std::map<HGLOBAL, MemoryBlock> memoryBlocks;

// Length of the path, or, when it doesn't fit with its NUL, the size that it needs.
UINT GiveDirectory(const std::string& path, LPSTR buffer, UINT size) {
  const UINT needed = static_cast<UINT>(path.size()) + 1;
  if (buffer == nullptr || size < needed) return needed;
  std::memcpy(buffer, path.c_str(), needed);
  return needed - 1;
}

}  // namespace

extern "C" {

LPSTR GetCommandLineA() {
  return machine::CurrentSettings().commandLine.data();
}

// There are no boxes of the system's to keep away here.
UINT SetErrorMode(UINT mode) {
  static UINT current = 0;
  return std::exchange(current, mode);
}

UINT GetSystemDirectoryA(LPSTR buffer, UINT size) {
  if (machine::CallFails("GetSystemDirectoryA")) return 0;
  return GiveDirectory(machine::CurrentSettings().systemDirectory, buffer, size);
}

UINT GetWindowsDirectoryA(LPSTR buffer, UINT size) {
  if (machine::CallFails("GetWindowsDirectoryA")) return 0;
  return GiveDirectory(machine::CurrentSettings().windowsDirectory, buffer, size);
}

BOOL GetVersionExA(LPOSVERSIONINFOA info) {
  if (machine::CallFails("GetVersionExA")) return FALSE;
  if (info == nullptr || info->dwOSVersionInfoSize != sizeof(OSVERSIONINFOA)) return FALSE;
  const bool nt = machine::CurrentSettings().ntFamily;
  *info = {};
  info->dwOSVersionInfoSize = sizeof(OSVERSIONINFOA);
  info->dwMajorVersion = nt ? 5 : 4;
  info->dwMinorVersion = nt ? 1 : 10;
  info->dwBuildNumber = nt ? 2600 : 0x040A08AE;  // on the 9x family with the version on top
  info->dwPlatformId = nt ? VER_PLATFORM_WIN32_NT : VER_PLATFORM_WIN32_WINDOWS;
  std::snprintf(info->szCSDVersion, sizeof(info->szCSDVersion), "%s",
                nt ? "Service Pack 3" : " A ");
  return TRUE;
}

LANGID GetSystemDefaultLangID() {
  if (machine::CallFails("GetSystemDefaultLangID")) return 0;
  return machine::CurrentSettings().language;
}

// Can't fail on Windows; a fault leaves the record all zero.
void GetLocalTime(LPSYSTEMTIME time) {
  *time = {};
  if (machine::CallFails("GetLocalTime")) return;
  if (machine::CurrentSettings().now) {
    *time = *machine::CurrentSettings().now;
    return;
  }
  timespec now = {};
  clock_gettime(CLOCK_REALTIME, &now);
  tm local = {};
  localtime_r(&now.tv_sec, &local);
  time->wYear = static_cast<WORD>(local.tm_year + 1900);
  time->wMonth = static_cast<WORD>(local.tm_mon + 1);
  time->wDayOfWeek = static_cast<WORD>(local.tm_wday);
  time->wDay = static_cast<WORD>(local.tm_mday);
  time->wHour = static_cast<WORD>(local.tm_hour);
  time->wMinute = static_cast<WORD>(local.tm_min);
  time->wSecond = static_cast<WORD>(local.tm_sec);
  time->wMilliseconds = static_cast<WORD>(now.tv_nsec / 1000000);
}

// A fixed block's handle is its address, a movable one's is not. Memory that nobody asked to be
// zeroed is filled, so that a program which reads it unset behaves the same each time.
HGLOBAL GlobalAlloc(UINT flags, SIZE_T size) {
  if (machine::CallFails("GlobalAlloc") || size > kMaxBlockSize) return nullptr;
  MemoryBlock block;
  block.isMovable = (flags & GMEM_MOVEABLE) != 0;
  if (size != 0 || !block.isMovable) {
    block.bytes.reset(new (std::nothrow) uint8_t[size]);
    if (block.bytes == nullptr) return nullptr;
    std::memset(block.bytes.get(), (flags & kZeroed) != 0 ? 0 : kUnsetByte, size);
  }
  static uintptr_t lastMemoryHandle = 0;
  const HGLOBAL handle =
      block.isMovable ? reinterpret_cast<HGLOBAL>(lastMemoryHandle += 4) : block.bytes.get();
  memoryBlocks[handle] = std::move(block);
  ObjectOpened(machine::ObjectKind::kMemoryBlock);
  return handle;
}

LPVOID GlobalLock(HGLOBAL handle) {
  if (machine::CallFails("GlobalLock")) return nullptr;
  const auto found = memoryBlocks.find(handle);
  if (found == memoryBlocks.end()) return nullptr;
  MemoryBlock& block = found->second;
  if (block.isMovable && block.bytes != nullptr) ++block.locks;
  return block.bytes.get();
}

// TRUE while the block is still locked; a fixed one always is.
BOOL GlobalUnlock(HGLOBAL handle) {
  if (machine::CallFails("GlobalUnlock")) return FALSE;
  const auto found = memoryBlocks.find(handle);
  if (found == memoryBlocks.end()) return FALSE;
  MemoryBlock& block = found->second;
  if (!block.isMovable) return TRUE;
  if (block.locks > 0) --block.locks;
  return block.locks > 0 ? TRUE : FALSE;
}

// A fault makes the answer a failure; the block is freed all the same.
HGLOBAL GlobalFree(HGLOBAL handle) {
  const bool fails = machine::CallFails("GlobalFree");
  if (handle == nullptr) return nullptr;
  if (memoryBlocks.erase(handle) == 0) return handle;
  ObjectClosed(machine::ObjectKind::kMemoryBlock);
  return fails ? handle : nullptr;
}

}  // extern "C"

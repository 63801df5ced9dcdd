// The program itself and the two libraries that it asks for at run time.
#include <cstring>
#include <string>
#include <string_view>

#include "machine/code_page.h"
#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/machine.h"
#include "machine/open_objects.h"
#include "platform/win32.h"

namespace {

using machine::EqualNoCase;

struct Library {
  std::string_view name;
  bool alwaysLoaded;
  int references;
  uintptr_t address;
};

constexpr uintptr_t kProgramAddress = 0x00400000;
Library kernel = {"kernel32", true, 0, 0x7C800000};
Library version = {"version", false, 0, 0x77C00000};

HMODULE HandleOf(uintptr_t address) {
  return reinterpret_cast<HMODULE>(address);
}

bool IsLoaded(const Library& library) {
  return library.alwaysLoaded || library.references > 0;
}

// By bare name or by full path in the system directory, with or without extension. Windows would
// look beside the program and in the current directory first: nothing there is a library here.
Library* FindLibrary(LPCSTR name) {
  if (name == nullptr) return nullptr;
  std::string_view rest = name;
  const std::string folder = machine::CurrentSettings().systemDirectory + '\\';
  if (EqualNoCase(rest.substr(0, folder.size()), folder)) rest.remove_prefix(folder.size());
  constexpr std::string_view kExtension = ".dll";
  if (rest.size() > kExtension.size() &&
      EqualNoCase(rest.substr(rest.size() - kExtension.size()), kExtension)) {
    rest.remove_suffix(kExtension.size());
  }
  for (Library* library : {&kernel, &version}) {
    if (EqualNoCase(rest, library->name)) return library;
  }
  return nullptr;
}

Library* FindLibrary(HMODULE module) {
  for (Library* library : {&kernel, &version}) {
    if (module == HandleOf(library->address) && IsLoaded(*library)) return library;
  }
  return nullptr;
}

template <typename Function>
FARPROC Address(Function* function) {
  return reinterpret_cast<FARPROC>(reinterpret_cast<void (*)()>(function));
}

FARPROC FindFunction(const Library* library, std::string_view name) {
  if (library == &kernel) {
    const bool present = machine::CurrentSettings().hasGetDiskFreeSpaceEx;
    if (name == "GetDiskFreeSpaceExA" && present) return Address(GetDiskFreeSpaceExA);
    if (name == "SetDefaultDllDirectories") return Address(SetDefaultDllDirectories);
  }
  if (library == &version) {
    if (name == "GetFileVersionInfoSizeA") return Address(GetFileVersionInfoSizeA);
    if (name == "GetFileVersionInfoA") return Address(GetFileVersionInfoA);
    if (name == "VerQueryValueA") return Address(VerQueryValueA);
  }
  return nullptr;
}

}  // namespace

extern "C" {

HMODULE GetModuleHandleA(LPCSTR name) {
  if (machine::CallFails("GetModuleHandleA")) return nullptr;
  if (name == nullptr) return HandleOf(kProgramAddress);
  const Library* library = FindLibrary(name);
  return library != nullptr && IsLoaded(*library) ? HandleOf(library->address) : nullptr;
}

// A path too long for the buffer is cut to its size, without a NUL, and the size is the answer.
DWORD GetModuleFileNameA(HMODULE module, LPSTR buffer, DWORD size) {
  if (machine::CallFails("GetModuleFileNameA")) return 0;
  if (module != nullptr && module != HandleOf(kProgramAddress)) return 0;
  const std::string path = machine::ImagePath();
  if (path.empty() || buffer == nullptr) return 0;
  if (path.size() >= size) {
    std::memcpy(buffer, path.data(), size);
    return size;
  }
  std::memcpy(buffer, path.c_str(), path.size() + 1);
  return static_cast<DWORD>(path.size());
}

HMODULE LoadLibraryA(LPCSTR name) {
  if (machine::CallFails("LoadLibraryA")) return nullptr;
  Library* library = FindLibrary(name);
  if (library == nullptr) return nullptr;
  ++library->references;
  ObjectOpened(machine::ObjectKind::kModule);
  return HandleOf(library->address);
}

// Windows lets a process free kernel32 as often as it likes; here each call needs its own load. A
// fault makes the answer a failure; the library is freed all the same.
BOOL FreeLibrary(HMODULE module) {
  const bool fails = machine::CallFails("FreeLibrary");
  Library* library = FindLibrary(module);
  if (library == nullptr || library->references == 0) return FALSE;
  --library->references;
  ObjectClosed(machine::ObjectKind::kModule);
  return !fails;
}

// Takes the one choice that changes nothing here, where libraries come from the system directory
// alone. Windows takes other sets of directories too.
BOOL SetDefaultDllDirectories(DWORD flags) {
  if (machine::CallFails("SetDefaultDllDirectories")) return FALSE;
  return flags == LOAD_LIBRARY_SEARCH_SYSTEM32 ? TRUE : FALSE;
}

// Functions by name alone: a name below 0x10000 is an ordinal.
FARPROC GetProcAddress(HMODULE module, LPCSTR name) {
  if (machine::CallFails("GetProcAddress")) return nullptr;
  const Library* library = FindLibrary(module);
  if (library == nullptr || reinterpret_cast<uintptr_t>(name) < 0x10000) return nullptr;
  return FindFunction(library, name);
}

}  // extern "C"

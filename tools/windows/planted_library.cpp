// A library that somebody put beside a program, in the hope that it is taken for one of the
// system's. It leaves a mark beside its own file, with ".loaded" behind the name, when the program
// loads it.
//
// No mark for what the system loads before the program runs: Windows takes the libraries of its own
// import tables from the system directory, but Wine's user32 imports version.dll by its bare name.
#include <windows.h>

namespace {

void LeaveMark(HINSTANCE library) {
  char path[MAX_PATH + sizeof(".loaded")] = {};
  const DWORD length = GetModuleFileNameA(library, path, MAX_PATH);
  if (length == 0 || length >= MAX_PATH) return;
  lstrcatA(path, ".loaded");
  CloseHandle(CreateFileA(path, GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr));
}

}  // namespace

// The last argument is null for a library that is loaded at run time.
BOOL WINAPI DllMain(HINSTANCE library, DWORD reason, LPVOID isPartOfTheStart) {
  if (reason == DLL_PROCESS_ATTACH && isPartOfTheStart == nullptr) LeaveMark(library);
  return TRUE;
}

// Directories, modules, disks, memory blocks and the shell.
#include <cstring>

#include "tests/contract/contract.h"

using contract::Expect;

CONTRACT(System, DirectoriesTellTheSizeTheyNeed) {
  for (const auto tell : {&GetWindowsDirectoryA, &GetSystemDirectoryA}) {
    char whole[MAX_PATH] = {};
    const UINT length = tell(whole, sizeof(whole));
    Expect(length, std::strlen(whole));
    Expect(whole[length - 1] == '\\', false);
    char part[MAX_PATH] = "x";
    Expect(tell(nullptr, 0), length + 1);
    Expect(tell(part, length), length + 1);
    Expect(tell(part, length + 1), length);
    Expect(part, whole);
  }
}

CONTRACT(System, ProgramsPathIsCutToTheBuffer) {
  const std::string path = "C:\\contract\\seam_contract.exe";
  const auto length = static_cast<DWORD>(path.size());
  char buffer[MAX_PATH] = {};
  Expect(GetModuleFileNameA(nullptr, buffer, sizeof(buffer)), length);
  Expect(buffer, path);
  Expect(GetModuleFileNameA(nullptr, buffer, length + 1), length);
  Expect(GetModuleFileNameA(nullptr, buffer, 0), 0);
  // The oldest systems leave the NUL out; none writes more than the buffer has.
  std::memset(buffer, '!', sizeof(buffer));
  for (const DWORD size : {length, DWORD{4}}) {
    Expect(GetModuleFileNameA(nullptr, buffer, size), size);
    Expect(std::string(buffer, 3), "C:\\");
    Expect(buffer[size] == (size == length ? '!' : path[size]), true);
  }
  Expect(GetModuleFileNameA(reinterpret_cast<HMODULE>(4), buffer, sizeof(buffer)), 0);
}

CONTRACT(System, LibrariesAreFoundByNameOrPath) {
  Expect(GetModuleHandleA(nullptr) != nullptr, true);
  const HMODULE kernel = GetModuleHandleA("KERNEL32");
  Expect(kernel != nullptr, true);
  Expect(GetModuleHandleA("kernel32.dll"), kernel);
  Expect(GetModuleHandleA("absent.dll"), nullptr);
  for (const char* name : {"absent.dll", "C:\\contract\\version.dll", "C:\\windows\\absent.dll"}) {
    Expect(LoadLibraryA(name), nullptr, name);
  }
  Expect(LoadLibraryA(nullptr), nullptr);
  Expect(FreeLibrary(nullptr), FALSE);

  char path[MAX_PATH + 16] = {};
  GetSystemDirectoryA(path, MAX_PATH);
  std::strcat(path, "\\Version.DLL");
  const HMODULE byPath = LoadLibraryA(path);
  const HMODULE byName = LoadLibraryA("VERSION");
  Expect(byPath != nullptr, true);
  Expect(byName, byPath);
  Expect(FreeLibrary(byName), TRUE);
  Expect(GetProcAddress(byPath, "VerQueryValueA") != nullptr, true);
  Expect(GetProcAddress(byPath, "verqueryvaluea"), nullptr, "the case counts");
  Expect(GetProcAddress(byPath, "GetDiskFreeSpaceExA"), nullptr);
  Expect(GetProcAddress(byPath, ""), nullptr);
  Expect(GetProcAddress(kernel, "GetDiskFreeSpaceExA") != nullptr, true);
  Expect(GetProcAddress(kernel, "VerQueryValueA"), nullptr);
  Expect(FreeLibrary(byPath), TRUE);
}

CONTRACT(System, FreeSpaceIsAskedOfARoot) {
  const struct {
    const char* root;
    bool drive;      // GetDiskFreeSpaceA takes it
    bool directory;  // GetDiskFreeSpaceExA takes it
  } rows[] = {
      {"C:\\", true, true},
      {"c:/", true, true},
      {"C:", true, true},
      {"C:\\contract", false, true},
      {"C:\\contract\\", false, true},
      {"C:\\contract\\seam_contract.exe", false, false},
      {"C:\\contract\\absent", false, false},
      {"Q:\\", false, false},
      {"Q:", false, false},
      {"", false, false},
  };
  for (const auto& row : rows) {
    DWORD sectors = 0, bytes = 0, freeClusters = 0, totalClusters = 0;
    const bool drive =
        GetDiskFreeSpaceA(row.root, &sectors, &bytes, &freeClusters, &totalClusters) != FALSE;
    // Wine, as the NT family, also takes a directory; the 9x family a root alone.
    if (!contract::IsWine() || row.drive == row.directory) Expect(drive, row.drive, row.root);
    if (drive) Expect(sectors * bytes != 0 && freeClusters <= totalClusters, true, row.root);
    ULARGE_INTEGER toCaller = {}, total = {}, all = {};
    const bool directory = GetDiskFreeSpaceExA(row.root, &toCaller, &total, &all) != FALSE;
    Expect(directory, row.directory, row.root);
    if (!directory) continue;
    Expect(toCaller.QuadPart <= all.QuadPart && all.QuadPart <= total.QuadPart, true, row.root);
    Expect(total.QuadPart != 0, true, row.root);
  }
  ULARGE_INTEGER bytes = {};
  Expect(GetDiskFreeSpaceExA(nullptr, &bytes, nullptr, nullptr), TRUE, "the current drive");
}

CONTRACT(System, VersionNeedsTheRecordsSize) {
  OSVERSIONINFOA info = {};
  Expect(GetVersionExA(&info), FALSE);
  info.dwOSVersionInfoSize = sizeof(info);
  Expect(sizeof(info), 148);
  Expect(GetVersionExA(&info), TRUE);
  Expect(info.dwPlatformId, VER_PLATFORM_WIN32_NT);
  Expect(GetSystemDefaultLangID() != 0, true);
  SYSTEMTIME time = {};
  GetLocalTime(&time);
  Expect(time.wYear >= 2020 && time.wMonth >= 1 && time.wMonth <= 12 && time.wDay >= 1, true);
}

CONTRACT(System, MovableBlocksAreLocked) {
  const HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE, 16);
  void* const bytes = GlobalLock(block);
  Expect(bytes != nullptr, true);
  Expect(GlobalLock(block), bytes);
  Expect(GlobalUnlock(block), TRUE);
  Expect(GlobalUnlock(block), FALSE);
  Expect(GlobalFree(block), nullptr);
  const HGLOBAL fixed = GlobalAlloc(0, 4);
  Expect(GlobalLock(fixed), fixed);
  Expect(GlobalFree(fixed), nullptr);
  Expect(GlobalFree(nullptr), nullptr);
  Expect(GlobalLock(nullptr), nullptr);
  Expect(GlobalAlloc(GMEM_MOVEABLE, SIZE_MAX / 2), nullptr);
}

CONTRACT(System, ShellRefusesWhatIsNotThere) {
  const HINSTANCE opened =
      ShellExecuteA(nullptr, "Open", "C:\\contract\\absent.txt", nullptr, nullptr, SW_SHOW);
  Expect(reinterpret_cast<uintptr_t>(opened) <= 32, true);
  char path[MAX_PATH];
  Expect(SHGetPathFromIDListA(nullptr, path), FALSE);
  IMalloc* allocator = nullptr;
  Expect(SHGetMalloc(&allocator), S_OK);
  allocator->Free(nullptr);
  allocator->Release();
  Expect(MessageBeep(MB_ICONEXCLAMATION), TRUE);
}

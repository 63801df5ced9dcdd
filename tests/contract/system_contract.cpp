// Directories, modules, disks, memory blocks; the shell and other programs.
#include <cstring>

#include "platform/procedure.h"
#include "tests/contract/contract.h"

namespace contract {

CONTRACT(System, DirectoriesTellTheSizeTheyNeed) {
  for (const auto tell : {&GetWindowsDirectoryA, &GetSystemDirectoryA}) {
    char whole[MAX_PATH] = {}, part[MAX_PATH] = "x";
    const UINT length = tell(whole, sizeof(whole));
    Expect({length, whole[length - 1] == '\\', tell(nullptr, 0), tell(part, length),
            tell(part, length + 1), part},
           {std::strlen(whole), false, length + 1, length + 1, length, whole});
  }
}

CONTRACT(System, ProgramsPathIsCutToTheBuffer) {
  constexpr DWORD kLength = sizeof(kProgram) - 1;
  char buffer[MAX_PATH] = {};
  Expect({GetModuleFileNameA(nullptr, buffer, sizeof(buffer)),
          GetModuleFileNameA(nullptr, buffer, kLength + 1), buffer,
          GetModuleFileNameA(nullptr, buffer, 0),
          GetModuleFileNameA(reinterpret_cast<HMODULE>(4), buffer, sizeof(buffer))},
         {kLength, kLength, kProgram, 0, 0});
  // The oldest systems leave the NUL out; none writes more than the buffer has.
  std::memset(buffer, '!', sizeof(buffer));
  for (const DWORD size : {kLength, DWORD{4}}) {
    Expect({GetModuleFileNameA(nullptr, buffer, size), std::string(buffer, 3), buffer[size]},
           {size, "C:\\", size == kLength ? '!' : kProgram[size]});
  }
}

CONTRACT(System, LibrariesAreFoundByNameOrPath) {
  const HMODULE kernel = GetModuleHandleA("KERNEL32");
  Expect({kernel != nullptr, GetModuleHandleA(nullptr) != nullptr,
          GetModuleHandleA("kernel32.dll") == kernel},
         {true});
  Expect({GetModuleHandleA("absent.dll"), LoadLibraryA("absent.dll"),
          LoadLibraryA("C:\\contract\\version.dll"), LoadLibraryA("C:\\windows\\absent.dll"),
          LoadLibraryA(nullptr), FreeLibrary(nullptr)},
         {0});
  char path[MAX_PATH + 16] = {};
  GetSystemDirectoryA(path, MAX_PATH);
  const HMODULE byPath = LoadLibraryA(std::strcat(path, "\\Version.DLL"));
  const HMODULE byName = LoadLibraryA("VERSION");
  const auto has = [](HMODULE module, const char* name) {
    return GetProcAddress(module, name) != nullptr;
  };
  Expect({byPath != nullptr, byName == byPath, FreeLibrary(byName), has(byPath, "VerQueryValueA"),
          has(kernel, "GetDiskFreeSpaceExA")},
         {true});
  Expect({has(byPath, "verqueryvaluea"), has(byPath, "GetDiskFreeSpaceExA"), has(byPath, ""),
          has(kernel, "VerQueryValueA")},
         {false});
  const auto setDirectories =
      FindProcedure<decltype(&SetDefaultDllDirectories)>(kernel, "SetDefaultDllDirectories");
  Expect({setDirectories(0), setDirectories(1), setDirectories(LOAD_LIBRARY_SEARCH_SYSTEM32),
          FreeLibrary(byPath)},
         {FALSE, FALSE, TRUE, TRUE});
}

CONTRACT(System, FreeSpaceIsAskedOfARoot) {
  // What takes the name: "drive " is GetDiskFreeSpaceA, "directory" GetDiskFreeSpaceExA.
  const auto takers = [](const std::string& root) {
    std::string told;
    DWORD sectors = 0, bytes = 0, clusters = 0, allClusters = 0;
    if (GetDiskFreeSpaceA(root.c_str(), &sectors, &bytes, &clusters, &allClusters) != FALSE) {
      Expect({sectors * bytes != 0, clusters <= allClusters}, {true}, root);
      // Wine, as the NT family, also takes a directory; the 9x family a root alone.
      if (!IsWine() || root.size() <= 3) told = "drive ";
    }
    ULARGE_INTEGER toCaller = {}, total = {}, all = {};
    if (GetDiskFreeSpaceExA(root.c_str(), &toCaller, &total, &all) == FALSE) return told;
    Expect({toCaller.QuadPart <= all.QuadPart, all.QuadPart <= total.QuadPart, total.QuadPart != 0},
           {true}, root);
    return told + "directory";
  };
  Expect({takers("C:\\"), takers("c:/"), takers("C:")}, {"drive directory"});
  Expect({takers("C:\\contract"), takers("C:\\contract\\")}, {"directory"});
  Expect(
      {takers(kProgram), takers("C:\\contract\\absent"), takers("Q:\\"), takers("Q:"), takers("")},
      {""});
  ULARGE_INTEGER bytes = {};
  Expect({GetDiskFreeSpaceExA(nullptr, &bytes, nullptr, nullptr)}, {TRUE}, "the current drive");
}

CONTRACT(System, VersionNeedsTheRecordsSize) {
  OSVERSIONINFOA info = {};
  Expect({sizeof(info), GetVersionExA(&info)}, {148, FALSE});
  info.dwOSVersionInfoSize = sizeof(info);
  SYSTEMTIME time = {};
  GetLocalTime(&time);
  Expect({GetVersionExA(&info), info.dwPlatformId == VER_PLATFORM_WIN32_NT,
          GetSystemDefaultLangID() != 0, time.wYear >= 2020, time.wMonth >= 1, time.wMonth <= 12,
          time.wDay >= 1},
         {true});
}

CONTRACT(System, MovableBlocksAreLocked) {
  const HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE, 16);
  const HGLOBAL fixed = GlobalAlloc(0, 4);
  void* const bytes = GlobalLock(block);
  Expect({bytes != nullptr, GlobalLock(block), GlobalUnlock(block), GlobalUnlock(block),
          GlobalFree(block), GlobalLock(fixed), GlobalFree(fixed)},
         {true, bytes, TRUE, FALSE, nullptr, fixed, nullptr});
  Expect({GlobalFree(nullptr), GlobalLock(nullptr), GlobalAlloc(GMEM_MOVEABLE, SIZE_MAX / 2)},
         {nullptr});
}

CONTRACT(Shell, OpensWhatIsThere) {
  const auto opens = [](const char* file) {
    return reinterpret_cast<uintptr_t>(
               ShellExecuteA(nullptr, "Open", file, "C:\\contract\\opened", nullptr, SW_SHOW)) > 32;
  };
  Expect({opens(kProgram), opens("C:\\contract\\absent.txt"), MessageBeep(MB_ICONEXCLAMATION)},
         {true, false, TRUE});
}

// The command line begins with the program's path, quoted or not, with its extension or without.
CONTRACT(Shell, StartsAProgramAndGivesTwoHandles) {
  CopyFileA(kProgram, "C:\\contract\\of two words.exe", FALSE);
  const auto starts = [](std::string line) {
    STARTUPINFOA startup = {};
    PROCESS_INFORMATION process = {};
    startup.cb = sizeof(startup);
    startup.dwFlags = STARTF_USESHOWWINDOW;
    startup.wShowWindow = SW_SHOW;
    if (CreateProcessA(nullptr, line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                       &process) == FALSE) {
      return false;
    }
    WaitForEnd(process.hProcess);
    Expect(
        {CloseHandle(process.hProcess), CloseHandle(process.hThread), CloseHandle(process.hThread)},
        {TRUE, TRUE, FALSE}, line);
    return true;
  };
  Expect({starts("C:\\contract\\seam_contract.exe C:\\contract\\started"),
          starts("C:\\contract\\seam_contract C:\\contract\\started"),
          starts("\"C:\\contract\\seam_contract.exe\"   C:\\contract\\started"),
          starts("C:\\contract\\of two words.exe C:\\contract\\started")},
         {true});
  Expect({starts("C:\\contract\\of two C:\\contract\\x"), starts("\"C:\\contract\\absent.exe\""),
          starts("absent x"), starts("C:\\contract C:\\contract\\x"), starts("")},
         {false});
  // On the stand-in no other program exists.
  if (IsWine()) Expect({ReadText("contract/started")}, {"started"});
}

}  // namespace contract

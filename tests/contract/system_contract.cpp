// Directories, modules, disks, memory blocks; the shell and other programs.
#include <cstring>

#include "platform/procedure.h"
#include "tests/contract/beyond_seam.h"
#include "tests/contract/contract.h"

namespace contract {

CONTRACT(System, DirectoriesTellTheSizeTheyNeed) {
  for (const auto tell : {&GetWindowsDirectoryA, &GetSystemDirectoryA}) {
    char whole[MAX_PATH] = {};
    char part[MAX_PATH] = "x";
    const UINT length = tell(whole, sizeof(whole));
    Expect(length, std::strlen(whole));
    Expect(whole[length - 1] == '\\', false);
    ExpectEach({tell(nullptr, 0), tell(part, length)}, {length + 1});
    ExpectEach({tell(part, length + 1), part}, {length, whole});
  }
}

CONTRACT(System, ProgramsPathIsCutToTheBuffer) {
  constexpr DWORD kLength = sizeof(kProgram) - 1;
  char buffer[MAX_PATH] = {};
  ExpectEach({GetModuleFileNameA(nullptr, buffer, sizeof(buffer)),
              GetModuleFileNameA(nullptr, buffer, kLength + 1)},
             {kLength});
  Expect(buffer, kProgram);
  ExpectEach({GetModuleFileNameA(nullptr, buffer, 0),
              GetModuleFileNameA(reinterpret_cast<HMODULE>(4), buffer, sizeof(buffer))},
             {0});
  // The oldest systems leave the NUL out; none writes more than the buffer has.
  std::memset(buffer, '!', sizeof(buffer));
  for (const DWORD size : {kLength, DWORD{4}}) {
    ExpectEach({GetModuleFileNameA(nullptr, buffer, size), std::string(buffer, 3), buffer[size]},
               {size, "C:\\", size == kLength ? '!' : kProgram[size]});
  }
}

CONTRACT(System, LibrariesAreFoundByNameOrPath) {
  const HMODULE kernel = GetModuleHandleA("KERNEL32");
  Expect(kernel != nullptr && GetModuleHandleA(nullptr) != nullptr, true);
  Expect(GetModuleHandleA("kernel32.dll"), kernel);
  ExpectEach({GetModuleHandleA("absent.dll"), LoadLibraryA("absent.dll"),
              LoadLibraryA("C:\\contract\\version.dll"), LoadLibraryA("C:\\windows\\absent.dll"),
              LoadLibraryA(nullptr), FreeLibrary(nullptr)},
             {0});
  char path[MAX_PATH + 16] = {};
  GetSystemDirectoryA(path, MAX_PATH);
  std::strcat(path, "\\Version.DLL");
  const HMODULE byPath = LoadLibraryA(path);
  const HMODULE byName = LoadLibraryA("VERSION");
  Expect(byPath != nullptr, true);
  Expect(byName, byPath);
  Expect(FreeLibrary(byName), TRUE);
  const auto has = [](HMODULE module, const char* name) {
    return GetProcAddress(module, name) != nullptr;
  };
  ExpectEach({has(byPath, "VerQueryValueA"), has(kernel, "GetDiskFreeSpaceExA")}, {true});
  ExpectEach({has(byPath, "verqueryvaluea"), has(byPath, "GetDiskFreeSpaceExA"), has(byPath, ""),
              has(kernel, "VerQueryValueA")},
             {false});
  Expect(FreeLibrary(byPath), TRUE);

  const auto setDirectories =
      FindProcedure<decltype(&SetDefaultDllDirectories)>(kernel, "SetDefaultDllDirectories");
  ExpectEach({setDirectories(0), setDirectories(1)}, {FALSE});
  Expect(setDirectories(LOAD_LIBRARY_SEARCH_SYSTEM32), TRUE);
}

CONTRACT(System, FreeSpaceIsAskedOfARoot) {
  // What takes the name: "drive " is GetDiskFreeSpaceA, "directory" GetDiskFreeSpaceExA.
  const auto takers = [](const std::string& root) {
    std::string told;
    DWORD sectors = 0, bytes = 0, clusters = 0, allClusters = 0;
    if (GetDiskFreeSpaceA(root.c_str(), &sectors, &bytes, &clusters, &allClusters) != FALSE) {
      Expect(sectors * bytes != 0 && clusters <= allClusters, true, root);
      // Wine, as the NT family, also takes a directory; the 9x family a root alone.
      if (!IsWine() || root.size() <= 3) told = "drive ";
    }
    ULARGE_INTEGER toCaller = {}, total = {}, all = {};
    if (GetDiskFreeSpaceExA(root.c_str(), &toCaller, &total, &all) == FALSE) return told;
    Expect(toCaller.QuadPart <= all.QuadPart && all.QuadPart <= total.QuadPart, true, root);
    Expect(total.QuadPart != 0, true, root);
    return told + "directory";
  };
  ExpectEach({takers("C:\\"), takers("c:/"), takers("C:")}, {"drive directory"});
  ExpectEach({takers("C:\\contract"), takers("C:\\contract\\")}, {"directory"});
  ExpectEach(
      {takers(kProgram), takers("C:\\contract\\absent"), takers("Q:\\"), takers("Q:"), takers("")},
      {""});
  ULARGE_INTEGER bytes = {};
  Expect(GetDiskFreeSpaceExA(nullptr, &bytes, nullptr, nullptr), TRUE, "the current drive");
}

CONTRACT(System, VersionNeedsTheRecordsSize) {
  OSVERSIONINFOA info = {};
  Expect(GetVersionExA(&info), FALSE);
  info.dwOSVersionInfoSize = sizeof(info);
  ExpectEach({sizeof(info), GetVersionExA(&info), info.dwPlatformId},
             {148, TRUE, VER_PLATFORM_WIN32_NT});
  Expect(GetSystemDefaultLangID() != 0, true);
  SYSTEMTIME time = {};
  GetLocalTime(&time);
  Expect(time.wYear >= 2020 && time.wMonth >= 1 && time.wMonth <= 12 && time.wDay >= 1, true);
}

CONTRACT(System, MovableBlocksAreLocked) {
  const HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE, 16);
  void* const bytes = GlobalLock(block);
  ExpectEach({bytes != nullptr, GlobalLock(block), GlobalUnlock(block), GlobalUnlock(block),
              GlobalFree(block)},
             {true, bytes, TRUE, FALSE, nullptr});
  const HGLOBAL fixed = GlobalAlloc(0, 4);
  Expect(GlobalLock(fixed), fixed);
  ExpectEach({GlobalFree(fixed), GlobalFree(nullptr), GlobalLock(nullptr),
              GlobalAlloc(GMEM_MOVEABLE, SIZE_MAX / 2)},
             {nullptr});
}

CONTRACT(Shell, OpensWhatIsThere) {
  const auto opens = [](const char* file) {
    const HINSTANCE answer =
        ShellExecuteA(nullptr, "Open", file, "C:\\contract\\opened", nullptr, SW_SHOW);
    return reinterpret_cast<uintptr_t>(answer) > 32;
  };
  ExpectEach({opens(kProgram), opens("C:\\contract\\absent.txt"), MessageBeep(MB_ICONEXCLAMATION)},
             {true, false, TRUE});
}

// The command line begins with the program's path, quoted or not, with its extension or without.
CONTRACT(Shell, StartsAProgramAndGivesTwoHandles) {
  CopyFileA(kProgram, "C:\\contract\\of two words.exe", FALSE);
  const auto starts = [](const char* line) {
    char writable[MAX_PATH] = {};
    std::strcpy(writable, line);
    STARTUPINFOA startup = {};
    startup.cb = sizeof(startup);
    startup.dwFlags = STARTF_USESHOWWINDOW;
    startup.wShowWindow = SW_SHOW;
    PROCESS_INFORMATION process = {};
    if (CreateProcessA(nullptr, writable, nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                       &process) == FALSE) {
      return false;
    }
    WaitForEnd(process.hProcess);
    ExpectEach({CloseHandle(process.hProcess), CloseHandle(process.hThread)}, {TRUE}, line);
    Expect(CloseHandle(process.hThread), FALSE, line);
    return true;
  };
  ExpectEach({starts("C:\\contract\\seam_contract.exe C:\\contract\\started"),
              starts("C:\\contract\\seam_contract C:\\contract\\started"),
              starts("\"C:\\contract\\seam_contract.exe\"   C:\\contract\\started"),
              starts("C:\\contract\\of two words.exe C:\\contract\\started")},
             {true});
  ExpectEach(
      {starts("C:\\contract\\of two C:\\contract\\x"), starts("\"C:\\contract\\absent.exe\""),
       starts("absent x"), starts("C:\\contract C:\\contract\\x"), starts("")},
      {false});
  // On the stand-in no other program exists.
  if (IsWine()) Expect(ReadText("C:\\contract\\started"), "started");
}

}  // namespace contract

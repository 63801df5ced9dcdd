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
    ExpectEach({tell(nullptr, 0), tell(part, length)}, length + 1);
    Expect(tell(part, length + 1), length);
    Expect(part, whole);
  }
}

CONTRACT(System, ProgramsPathIsCutToTheBuffer) {
  constexpr DWORD kLength = sizeof(kProgram) - 1;
  char buffer[MAX_PATH] = {};
  ExpectEach({GetModuleFileNameA(nullptr, buffer, sizeof(buffer)),
              GetModuleFileNameA(nullptr, buffer, kLength + 1)},
             kLength);
  Expect(buffer, kProgram);
  ExpectEach({GetModuleFileNameA(nullptr, buffer, 0),
              GetModuleFileNameA(reinterpret_cast<HMODULE>(4), buffer, sizeof(buffer))},
             0);
  // The oldest systems leave the NUL out; none writes more than the buffer has.
  std::memset(buffer, '!', sizeof(buffer));
  for (const DWORD size : {kLength, DWORD{4}}) {
    Expect(GetModuleFileNameA(nullptr, buffer, size), size);
    Expect(std::string(buffer, 3), "C:\\");
    Expect(buffer[size], size == kLength ? '!' : kProgram[size]);
  }
}

CONTRACT(System, LibrariesAreFoundByNameOrPath) {
  const HMODULE kernel = GetModuleHandleA("KERNEL32");
  Expect(kernel != nullptr && GetModuleHandleA(nullptr) != nullptr, true);
  Expect(GetModuleHandleA("kernel32.dll"), kernel);
  ExpectEach({GetModuleHandleA("absent.dll"), LoadLibraryA("absent.dll"),
              LoadLibraryA("C:\\contract\\version.dll"), LoadLibraryA("C:\\windows\\absent.dll"),
              LoadLibraryA(nullptr), FreeLibrary(nullptr)},
             0);
  char path[MAX_PATH + 16] = {};
  GetSystemDirectoryA(path, MAX_PATH);
  std::strcat(path, "\\Version.DLL");
  const HMODULE byPath = LoadLibraryA(path);
  const HMODULE byName = LoadLibraryA("VERSION");
  Expect(byPath != nullptr, true);
  Expect(byName, byPath);
  Expect(FreeLibrary(byName), TRUE);
  Expect(GetProcAddress(byPath, "VerQueryValueA") != nullptr &&
             GetProcAddress(kernel, "GetDiskFreeSpaceExA") != nullptr,
         true);
  for (const char* name : {"verqueryvaluea", "GetDiskFreeSpaceExA", ""}) {
    Expect(GetProcAddress(byPath, name) != nullptr, false, name);
  }
  Expect(GetProcAddress(kernel, "VerQueryValueA") != nullptr, false);
  Expect(FreeLibrary(byPath), TRUE);

  const auto setDirectories =
      FindProcedure<decltype(&SetDefaultDllDirectories)>(kernel, "SetDefaultDllDirectories");
  ExpectEach({setDirectories(0), setDirectories(1)}, FALSE);
  Expect(setDirectories(LOAD_LIBRARY_SEARCH_SYSTEM32), TRUE);
}

CONTRACT(System, FreeSpaceIsAskedOfARoot) {
  const struct {
    const char* root;
    bool drive;      // GetDiskFreeSpaceA takes it
    bool directory;  // GetDiskFreeSpaceExA takes it
  } rows[] = {{"C:\\", true, true},
              {"c:/", true, true},
              {"C:", true, true},
              {"C:\\contract", false, true},
              {"C:\\contract\\", false, true},
              {kProgram, false, false},
              {"C:\\contract\\absent", false, false},
              {"Q:\\", false, false},
              {"Q:", false, false},
              {"", false, false}};
  for (const auto& row : rows) {
    DWORD sectors = 0, bytes = 0, freeClusters = 0, totalClusters = 0;
    const bool drive =
        GetDiskFreeSpaceA(row.root, &sectors, &bytes, &freeClusters, &totalClusters) != FALSE;
    // Wine, as the NT family, also takes a directory; the 9x family a root alone.
    if (!IsWine() || row.drive == row.directory) Expect(drive, row.drive, row.root);
    if (drive) Expect(sectors * bytes != 0 && freeClusters <= totalClusters, true, row.root);
    ULARGE_INTEGER toCaller = {}, total = {}, all = {};
    const bool directory = GetDiskFreeSpaceExA(row.root, &toCaller, &total, &all) != FALSE;
    Expect(directory, row.directory, row.root);
    const bool isInOrder =
        toCaller.QuadPart <= all.QuadPart && all.QuadPart <= total.QuadPart && total.QuadPart != 0;
    if (directory) Expect(isInOrder, true, row.root);
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
  ExpectEach({GlobalUnlock(block), GlobalFree(block)}, 0);
  const HGLOBAL fixed = GlobalAlloc(0, 4);
  Expect(GlobalLock(fixed), fixed);
  ExpectEach({GlobalFree(fixed), GlobalFree(nullptr), GlobalLock(nullptr),
              GlobalAlloc(GMEM_MOVEABLE, SIZE_MAX / 2)},
             nullptr);
}

CONTRACT(Shell, OpensWhatIsThere) {
  const auto opens = [](const char* file) {
    const HINSTANCE answer =
        ShellExecuteA(nullptr, "Open", file, "C:\\contract\\opened", nullptr, SW_SHOW);
    return reinterpret_cast<uintptr_t>(answer) > 32;
  };
  Expect(opens(kProgram), true);
  Expect(opens("C:\\contract\\absent.txt"), false);
  Expect(MessageBeep(MB_ICONEXCLAMATION), TRUE);
}

// The command line begins with the program's path, quoted or not, with its extension or without.
CONTRACT(Shell, StartsAProgramAndGivesTwoHandles) {
  CopyFileA(kProgram, "C:\\contract\\of two words.exe", FALSE);
  const std::pair<const char*, BOOL> rows[] = {
      {"C:\\contract\\seam_contract.exe C:\\contract\\first", TRUE},
      {"C:\\contract\\seam_contract C:\\contract\\second", TRUE},
      {"\"C:\\contract\\seam_contract.exe\"   C:\\contract\\third", TRUE},
      {"C:\\contract\\of two words.exe C:\\contract\\fourth", TRUE},
      {"C:\\contract\\of two C:\\contract\\fifth", FALSE},
      {"\"C:\\contract\\absent.exe\"", FALSE},
      {"absent x", FALSE},
      {"C:\\contract C:\\contract\\x", FALSE},
      {"", FALSE}};
  for (const auto& [line, starts] : rows) {
    char writable[MAX_PATH] = {};
    std::strcpy(writable, line);
    STARTUPINFOA startup = {};
    startup.cb = sizeof(startup);
    startup.dwFlags = STARTF_USESHOWWINDOW;
    startup.wShowWindow = SW_SHOW;
    PROCESS_INFORMATION process = {};
    Expect(CreateProcessA(nullptr, writable, nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                          &process),
           starts, line);
    if (starts == FALSE) continue;
    WaitForEnd(process.hProcess);
    ExpectEach({CloseHandle(process.hProcess), CloseHandle(process.hThread)}, TRUE, line);
    Expect(CloseHandle(process.hThread), FALSE, line);
  }
  // On the stand-in no other program exists.
  if (IsWine()) Expect(ReadText("C:\\contract\\first"), "started");
}

}  // namespace contract

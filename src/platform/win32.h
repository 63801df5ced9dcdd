// The seam between the program and the system.
//
// This is the one file that includes <windows.h>. The native build has no Windows: there the same
// subset of types, constants and functions is declared below, and the stand-in machine implements
// it. Product code calls the Win32 names themselves in both builds; which implementation answers is
// decided by the linker. The functions declared here are also all that the program may import.
#pragma once

#ifdef _WIN32

#define WIN32_LEAN_AND_MEAN
#ifndef NOMINMAX  // the C++ library defines it too
#define NOMINMAX
#endif
#include <windows.h>
// After windows.h.
#include <fcntl.h>
#include <io.h>
#include <share.h>
#include <sys/stat.h>

#else

#include <stddef.h>
#include <stdint.h>

// LONG and DWORD have 32 bits on Windows in every build, so they can't be `long` here.
typedef int BOOL;
typedef uint8_t BYTE;
typedef uint16_t WORD;
typedef uint32_t DWORD;
typedef uint32_t UINT;
typedef uint32_t ULONG;
typedef int32_t LONG;
typedef int32_t LSTATUS;
typedef uint16_t LANGID;
typedef intptr_t LRESULT;
typedef intptr_t LPARAM;
typedef uintptr_t WPARAM;
typedef uintptr_t ULONG_PTR;
typedef size_t SIZE_T;
typedef char CHAR;
typedef char* LPSTR;
typedef const char* LPCSTR;
typedef void* LPVOID;
typedef const void* LPCVOID;
typedef void* HANDLE;
typedef void* HGLOBAL;
typedef DWORD* LPDWORD;
typedef DWORD* PDWORD;
typedef UINT* PUINT;
typedef DWORD REGSAM;
typedef intptr_t (*FARPROC)();

#define MORIV_DECLARE_HANDLE(name) \
  struct name##__;                 \
  typedef struct name##__* name
MORIV_DECLARE_HANDLE(HINSTANCE);
MORIV_DECLARE_HANDLE(HKEY);
MORIV_DECLARE_HANDLE(HWND);
#undef MORIV_DECLARE_HANDLE
typedef HINSTANCE HMODULE;
typedef HKEY* PHKEY;

#define WINAPI
#define CALLBACK
#define TRUE     1
#define FALSE    0
#define MAX_PATH 260

#define INVALID_HANDLE_VALUE     (reinterpret_cast<HANDLE>(static_cast<intptr_t>(-1)))

// Files
#define GENERIC_READ             0x80000000u
#define GENERIC_WRITE            0x40000000u
#define CREATE_ALWAYS            2u
#define OPEN_EXISTING            3u
#define FILE_ATTRIBUTE_READONLY  0x1u
#define FILE_ATTRIBUTE_DIRECTORY 0x10u
#define FILE_ATTRIBUTE_ARCHIVE   0x20u
#define FILE_ATTRIBUTE_NORMAL    0x80u
#define INVALID_FILE_ATTRIBUTES  0xFFFFFFFFu
#define INVALID_FILE_SIZE        0xFFFFFFFFu
#define INVALID_SET_FILE_POINTER 0xFFFFFFFFu
#define FILE_BEGIN               0u
#define FILE_CURRENT             1u
#define FILE_END                 2u

struct SECURITY_ATTRIBUTES {
  DWORD nLength;
  LPVOID lpSecurityDescriptor;
  BOOL bInheritHandle;
};
typedef SECURITY_ATTRIBUTES* LPSECURITY_ATTRIBUTES;

// No product code overlaps its input and output; the type stands only for the null argument.
struct OVERLAPPED;

typedef union {
  struct {
    DWORD LowPart;
    DWORD HighPart;
  } u;
  uint64_t QuadPart;
} ULARGE_INTEGER;
typedef ULARGE_INTEGER* PULARGE_INTEGER;

// Registry
#define HKEY_CLASSES_ROOT        (reinterpret_cast<HKEY>(static_cast<uintptr_t>(0x80000000u)))
#define HKEY_LOCAL_MACHINE       (reinterpret_cast<HKEY>(static_cast<uintptr_t>(0x80000002u)))
#define KEY_READ                 0x20019u
#define KEY_WRITE                0x20006u
#define KEY_ALL_ACCESS           0xF003Fu
#define REG_SZ                   1u
#define REG_EXPAND_SZ            2u
#define REG_OPTION_NON_VOLATILE  0u

#define ERROR_SUCCESS              0
#define ERROR_FILE_NOT_FOUND       2
#define ERROR_PATH_NOT_FOUND       3
#define ERROR_ACCESS_DENIED        5
#define ERROR_INVALID_HANDLE       6
#define ERROR_SHARING_VIOLATION    32
#define ERROR_INVALID_PARAMETER    87
#define ERROR_DISK_FULL            112
#define ERROR_NEGATIVE_SEEK        131
#define ERROR_DIR_NOT_EMPTY        145
#define ERROR_ALREADY_EXISTS       183
#define ERROR_MORE_DATA            234
#define ERROR_NO_MORE_ITEMS        259

// System
#define VER_PLATFORM_WIN32_WINDOWS 1u
#define VER_PLATFORM_WIN32_NT      2u
#define GMEM_MOVEABLE              2u

struct OSVERSIONINFOA {
  DWORD dwOSVersionInfoSize;
  DWORD dwMajorVersion;
  DWORD dwMinorVersion;
  DWORD dwBuildNumber;
  DWORD dwPlatformId;
  CHAR szCSDVersion[128];
};
typedef OSVERSIONINFOA* LPOSVERSIONINFOA;

struct SYSTEMTIME {
  WORD wYear;
  WORD wMonth;
  WORD wDayOfWeek;
  WORD wDay;
  WORD wHour;
  WORD wMinute;
  WORD wSecond;
  WORD wMilliseconds;
};
typedef SYSTEMTIME* LPSYSTEMTIME;

// Windows and messages
#define WM_SETTEXT                 0x000Cu
#define PM_REMOVE                  0x0001u
#define MB_OK                      0u

struct POINT {
  LONG x;
  LONG y;
};
struct MSG {
  HWND hwnd;
  UINT message;
  WPARAM wParam;
  LPARAM lParam;
  DWORD time;
  POINT pt;
};
typedef MSG* LPMSG;

// The runtime's descriptor layer
#define _O_RDONLY                  0x0000
#define _O_WRONLY                  0x0001
#define _O_BINARY                  0x8000
#define _SH_DENYNO                 0x40
#define _S_IREAD                   0x0100
#define _S_IWRITE                  0x0080

struct _stat {
  uint16_t st_mode;
  int32_t st_size;
};

extern "C" {

HANDLE CreateFileA(LPCSTR name, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security,
                   DWORD disposition, DWORD flags, HANDLE templateFile);
BOOL ReadFile(HANDLE file, LPVOID buffer, DWORD count, LPDWORD done, OVERLAPPED* overlapped);
BOOL WriteFile(HANDLE file, LPCVOID buffer, DWORD count, LPDWORD done, OVERLAPPED* overlapped);
DWORD GetFileSize(HANDLE file, LPDWORD high);
DWORD SetFilePointer(HANDLE file, LONG distance, LONG* high, DWORD method);
BOOL CloseHandle(HANDLE handle);
BOOL DeleteFileA(LPCSTR name);
BOOL CopyFileA(LPCSTR from, LPCSTR to, BOOL failIfExists);
BOOL CreateDirectoryA(LPCSTR name, LPSECURITY_ATTRIBUTES security);
BOOL RemoveDirectoryA(LPCSTR name);
DWORD GetFileAttributesA(LPCSTR name);

int _sopen(const char* name, int flags, int share, ...);
int _creat(const char* name, int permission);
int _umask(int mask);
int _chmod(const char* name, int permission);
int _setmode(int descriptor, int mode);
int _read(int descriptor, void* buffer, unsigned count);
int _write(int descriptor, const void* buffer, unsigned count);
int32_t _lseek(int descriptor, int32_t offset, int origin);
int32_t _tell(int descriptor);
int _close(int descriptor);
// The runtime gives one name to the function and its record.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wshadow"
int _stat(const char* name, struct _stat* status);
#pragma GCC diagnostic pop

DWORD GetModuleFileNameA(HMODULE module, LPSTR buffer, DWORD size);
HMODULE GetModuleHandleA(LPCSTR name);
UINT GetSystemDirectoryA(LPSTR buffer, UINT size);
UINT GetWindowsDirectoryA(LPSTR buffer, UINT size);
BOOL GetVersionExA(LPOSVERSIONINFOA info);
LANGID GetSystemDefaultLangID();
void GetLocalTime(LPSYSTEMTIME time);
HMODULE LoadLibraryA(LPCSTR name);
FARPROC GetProcAddress(HMODULE module, LPCSTR name);
BOOL FreeLibrary(HMODULE module);
BOOL GetDiskFreeSpaceA(LPCSTR root, LPDWORD sectorsPerCluster, LPDWORD bytesPerSector,
                       LPDWORD freeClusters, LPDWORD totalClusters);
HGLOBAL GlobalAlloc(UINT flags, SIZE_T size);
LPVOID GlobalLock(HGLOBAL block);
BOOL GlobalUnlock(HGLOBAL block);
HGLOBAL GlobalFree(HGLOBAL block);

LSTATUS RegOpenKeyExA(HKEY key, LPCSTR subkey, DWORD options, REGSAM access, PHKEY result);
LSTATUS RegCreateKeyExA(HKEY key, LPCSTR subkey, DWORD reserved, LPSTR keyClass, DWORD options,
                        REGSAM access, const SECURITY_ATTRIBUTES* security, PHKEY result,
                        LPDWORD disposition);
LSTATUS RegQueryValueExA(HKEY key, LPCSTR name, LPDWORD reserved, LPDWORD type, BYTE* data,
                         LPDWORD size);
LSTATUS RegSetValueExA(HKEY key, LPCSTR name, DWORD reserved, DWORD type, const BYTE* data,
                       DWORD size);
LSTATUS RegDeleteKeyA(HKEY key, LPCSTR subkey);
LSTATUS RegDeleteValueA(HKEY key, LPCSTR name);
LSTATUS RegEnumKeyA(HKEY key, DWORD index, LPSTR name, DWORD size);
LSTATUS RegCloseKey(HKEY key);

int LoadStringA(HINSTANCE module, UINT id, LPSTR buffer, int size);
int MessageBoxA(HWND owner, LPCSTR text, LPCSTR caption, UINT type);
HWND GetDlgItem(HWND dialog, int id);
LRESULT SendMessageA(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
BOOL PeekMessageA(LPMSG message, HWND window, UINT first, UINT last, UINT remove);
BOOL TranslateMessage(const MSG* message);
LRESULT DispatchMessageA(const MSG* message);

// Reached through GetProcAddress alone, never imported: a system can lack the first one, and a
// version.dll that lies beside the program must not be loaded in the system's place.
BOOL GetDiskFreeSpaceExA(LPCSTR root, PULARGE_INTEGER freeToCaller, PULARGE_INTEGER total,
                         PULARGE_INTEGER freeBytes);
DWORD GetFileVersionInfoSizeA(LPCSTR name, LPDWORD handle);
BOOL GetFileVersionInfoA(LPCSTR name, DWORD handle, DWORD size, LPVOID data);
BOOL VerQueryValueA(LPCVOID data, LPCSTR path, LPVOID* value, PUINT length);

int WINAPI WinMain(HINSTANCE instance, HINSTANCE previous, LPSTR commandLine, int show);

}  // extern "C"

#endif

// The seam between the program and the system.
//
// This is the one file that includes <windows.h>. The native build has no Windows: there the same
// subset of types, constants and functions is declared below, and the stand-in machine implements
// it. Product code calls the Win32 names themselves in both builds; which implementation answers is
// decided by the linker. Of the system's functions the program may import those declared here and
// no others, except the last group, which it looks up; tools/imports/ has the list, with the
// runtime's.
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
#include <shellapi.h>
#include <shlobj.h>
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
typedef uint32_t COLORREF;
typedef intptr_t INT_PTR;
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
typedef void* HGDIOBJ;
typedef DWORD* LPDWORD;
typedef UINT* PUINT;
typedef DWORD REGSAM;
typedef intptr_t (*FARPROC)();

#define MORIV_DECLARE_HANDLE(name) \
  struct name##__;                 \
  typedef struct name##__* name
MORIV_DECLARE_HANDLE(HINSTANCE);
MORIV_DECLARE_HANDLE(HKEY);
MORIV_DECLARE_HANDLE(HWND);
MORIV_DECLARE_HANDLE(HDC);
#undef MORIV_DECLARE_HANDLE
typedef HINSTANCE HMODULE;
typedef HKEY* PHKEY;
// Pens, brushes, fonts and bitmaps are all objects of the graphics system and convert to HGDIOBJ.
typedef void* HBRUSH;
typedef void* HFONT;
typedef void* HBITMAP;

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
#define ERROR_ACCESS_DENIED        5
#define ERROR_INVALID_HANDLE       6
#define ERROR_INVALID_PARAMETER    87
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

inline constexpr DWORD LOAD_LIBRARY_SEARCH_SYSTEM32 = 0x800;
inline constexpr UINT SEM_FAILCRITICALERRORS = 0x0001;
inline constexpr UINT SEM_NOOPENFILEERRORBOX = 0x8000;

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
#define WM_GETTEXT                 0x000Du
#define WM_DRAWITEM                0x002Bu
#define WM_MEASUREITEM             0x002Cu
#define WM_DELETEITEM              0x002Du
#define WM_SETFONT                 0x0030u
#define WM_INITDIALOG              0x0110u
#define WM_COMMAND                 0x0111u
#define EM_SETSEL                  0x00B1u
#define BM_SETSTYLE                0x00F4u
#define DM_SETDEFID                0x0401u
#define CB_ADDSTRING               0x0143u
#define CB_GETCOUNT                0x0146u
#define CB_GETCURSEL               0x0147u
#define CB_RESETCONTENT            0x014Bu
#define CB_SETCURSEL               0x014Eu
#define CB_SETITEMDATA             0x0151u
#define CB_GETITEMDATA             0x0150u
#define CB_ERR                     (-1)
#define CB_ERRSPACE                (-2)
#define STN_CLICKED                0
#define CBN_SELCHANGE              1
#define PM_REMOVE                  0x0001u

#define IDOK               1
#define IDCANCEL           2
#define IDYES              6
#define IDNO               7
#define MB_OK              0x0000u
#define MB_YESNO           0x0004u
#define MB_ICONQUESTION    0x0020u
#define MB_ICONEXCLAMATION 0x0030u
#define MB_DEFBUTTON2      0x0100u

#define WS_VISIBLE       0x10000000
#define WS_DISABLED      0x08000000
#define BS_DEFPUSHBUTTON 0x0001
#define SS_OWNERDRAW     0x000D
#define GWL_ID           (-12)
#define GWL_STYLE        (-16)
#define SW_HIDE          0
#define SW_SHOW          5

#define LOWORD(value)        (static_cast<WORD>((value)&0xFFFF))
#define HIWORD(value)        (static_cast<WORD>(((value) >> 16) & 0xFFFF))
#define MAKEINTRESOURCEA(id) (reinterpret_cast<LPCSTR>(static_cast<uintptr_t>(id)))

struct POINT {
  LONG x;
  LONG y;
};
struct RECT {
  LONG left;
  LONG top;
  LONG right;
  LONG bottom;
};
typedef RECT* LPRECT;

typedef INT_PTR(CALLBACK* DLGPROC)(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam);

// Drawing
#define ODT_COMBOBOX         3
#define ODS_SELECTED         0x0001
#define ODS_FOCUS            0x0010
#define COLOR_WINDOW         5
#define COLOR_HIGHLIGHT      13
#define COLOR_HIGHLIGHTTEXT  14
#define PATCOPY              0x00F00021u
#define SRCCOPY              0x00CC0020u
#define DT_VCENTER           0x0004u
#define DT_SINGLELINE        0x0020u

struct BITMAP {
  LONG bmType;
  LONG bmWidth;
  LONG bmHeight;
  LONG bmWidthBytes;
  WORD bmPlanes;
  WORD bmBitsPixel;
  LPVOID bmBits;
};

struct MEASUREITEMSTRUCT {
  UINT CtlType;
  UINT CtlID;
  UINT itemID;
  UINT itemWidth;
  UINT itemHeight;
  ULONG_PTR itemData;
};
struct DRAWITEMSTRUCT {
  UINT CtlType;
  UINT CtlID;
  UINT itemID;
  UINT itemAction;
  UINT itemState;
  HWND hwndItem;
  HDC hDC;
  RECT rcItem;
  ULONG_PTR itemData;
};
struct DELETEITEMSTRUCT {
  UINT CtlType;
  UINT CtlID;
  UINT itemID;
  HWND hwndItem;
  ULONG_PTR itemData;
};

// Shell and processes
#define STARTF_USESHOWWINDOW 0x0001u

struct STARTUPINFOA {
  DWORD cb;
  LPSTR lpReserved;
  LPSTR lpDesktop;
  LPSTR lpTitle;
  DWORD dwX;
  DWORD dwY;
  DWORD dwXSize;
  DWORD dwYSize;
  DWORD dwXCountChars;
  DWORD dwYCountChars;
  DWORD dwFillAttribute;
  DWORD dwFlags;
  WORD wShowWindow;
  WORD cbReserved2;
  BYTE* lpReserved2;
  HANDLE hStdInput;
  HANDLE hStdOutput;
  HANDLE hStdError;
};
struct PROCESS_INFORMATION {
  HANDLE hProcess;
  HANDLE hThread;
  DWORD dwProcessId;
  DWORD dwThreadId;
};

// The folder picker answers with an item list, which belongs to the caller and goes back to the
// allocator that SHGetMalloc gives. Of the allocator only Free and Release are called.
struct ITEMIDLIST;
typedef ITEMIDLIST* LPITEMIDLIST;
typedef const ITEMIDLIST* LPCITEMIDLIST;
struct BROWSEINFOA {
  HWND hwndOwner;
  LPCITEMIDLIST pidlRoot;
  LPSTR pszDisplayName;
  LPCSTR lpszTitle;
  UINT ulFlags;
  void* lpfn;
  LPARAM lParam;
  int iImage;
};
typedef LONG HRESULT;
#define S_OK                 0
struct IMalloc {
  virtual ULONG Release() = 0;
  virtual void Free(void* block) = 0;

 protected:
  ~IMalloc() = default;
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
#define _O_RDONLY            0x0000
#define _O_WRONLY            0x0001
#define _O_BINARY            0x8000
#define _SH_DENYNO           0x40
#define _S_IREAD             0x0100
#define _S_IWRITE            0x0080

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
LPSTR GetCommandLineA(void);
UINT SetErrorMode(UINT mode);
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
LSTATUS RegQueryValueA(HKEY key, LPCSTR subkey, LPSTR data, LONG* size);
LSTATUS RegSetValueExA(HKEY key, LPCSTR name, DWORD reserved, DWORD type, const BYTE* data,
                       DWORD size);
LSTATUS RegDeleteKeyA(HKEY key, LPCSTR subkey);
LSTATUS RegDeleteValueA(HKEY key, LPCSTR name);
LSTATUS RegEnumKeyA(HKEY key, DWORD index, LPSTR name, DWORD size);
LSTATUS RegCloseKey(HKEY key);

int LoadStringA(HINSTANCE module, UINT id, LPSTR buffer, int size);
HBITMAP LoadBitmapA(HINSTANCE module, LPCSTR id);

INT_PTR DialogBoxParamA(HINSTANCE module, LPCSTR id, HWND owner, DLGPROC procedure, LPARAM data);
BOOL EndDialog(HWND dialog, INT_PTR result);
HWND GetDlgItem(HWND dialog, int id);
LONG GetWindowLongA(HWND window, int index);
LONG SetWindowLongA(HWND window, int index, LONG value);
BOOL ShowWindow(HWND window, int show);
BOOL EnableWindow(HWND window, BOOL enable);
BOOL IsWindow(HWND window);
BOOL DestroyWindow(HWND window);
HWND SetFocus(HWND window);
BOOL SetWindowTextA(HWND window, LPCSTR text);
LRESULT SendMessageA(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
BOOL PostMessageA(HWND window, UINT message, WPARAM wParam, LPARAM lParam);
int MessageBoxA(HWND owner, LPCSTR text, LPCSTR caption, UINT type);
BOOL MessageBeep(UINT type);
BOOL PeekMessageA(LPMSG message, HWND window, UINT first, UINT last, UINT remove);
BOOL TranslateMessage(const MSG* message);
LRESULT DispatchMessageA(const MSG* message);

int GetObjectA(HGDIOBJ object, int size, LPVOID record);
HFONT CreateFontA(int height, int width, int escapement, int orientation, int weight, DWORD italic,
                  DWORD underline, DWORD strikeOut, DWORD characterSet, DWORD outputPrecision,
                  DWORD clipPrecision, DWORD quality, DWORD pitch, LPCSTR face);
HBRUSH CreateSolidBrush(COLORREF color);
BOOL DeleteObject(HGDIOBJ object);
HDC GetDC(HWND window);
int ReleaseDC(HWND window, HDC dc);
HDC CreateCompatibleDC(HDC dc);
BOOL DeleteDC(HDC dc);
HGDIOBJ SelectObject(HDC dc, HGDIOBJ object);
DWORD GetSysColor(int index);
COLORREF SetTextColor(HDC dc, COLORREF color);
COLORREF SetBkColor(HDC dc, COLORREF color);
BOOL PatBlt(HDC dc, int x, int y, int width, int height, DWORD operation);
BOOL BitBlt(HDC dc, int x, int y, int width, int height, HDC source, int sourceX, int sourceY,
            DWORD operation);
int DrawTextA(HDC dc, LPCSTR text, int length, LPRECT rectangle, UINT format);
BOOL DrawFocusRect(HDC dc, const RECT* rectangle);

HINSTANCE ShellExecuteA(HWND owner, LPCSTR verb, LPCSTR file, LPCSTR parameters, LPCSTR directory,
                        int show);
BOOL CreateProcessA(LPCSTR application, LPSTR commandLine, LPSECURITY_ATTRIBUTES process,
                    LPSECURITY_ATTRIBUTES thread, BOOL inherit, DWORD flags, LPVOID environment,
                    LPCSTR directory, STARTUPINFOA* startup, PROCESS_INFORMATION* information);
LPITEMIDLIST SHBrowseForFolderA(BROWSEINFOA* info);
BOOL SHGetPathFromIDListA(LPCITEMIDLIST list, LPSTR path);
HRESULT SHGetMalloc(IMalloc** allocator);

// Reached through GetProcAddress alone, never imported: a system can lack the first two, and a
// version.dll that lies beside the program must not be loaded in the system's place.
BOOL SetDefaultDllDirectories(DWORD flags);
BOOL GetDiskFreeSpaceExA(LPCSTR root, PULARGE_INTEGER freeToCaller, PULARGE_INTEGER total,
                         PULARGE_INTEGER freeBytes);
DWORD GetFileVersionInfoSizeA(LPCSTR name, LPDWORD handle);
BOOL GetFileVersionInfoA(LPCSTR name, DWORD handle, DWORD size, LPVOID data);
BOOL VerQueryValueA(LPCVOID data, LPCSTR path, LPVOID* value, PUINT length);

}  // extern "C"

#endif

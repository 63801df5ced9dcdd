// Names of the functions of platform/win32.h, for faults that are given by name.
#pragma once

#include <algorithm>
#include <string_view>

namespace machine {

inline constexpr std::string_view kSeamFunctions[] = {
    "CreateFileA",
    "ReadFile",
    "WriteFile",
    "GetFileSize",
    "SetFilePointer",
    "CloseHandle",
    "DeleteFileA",
    "CopyFileA",
    "CreateDirectoryA",
    "RemoveDirectoryA",
    "GetFileAttributesA",
    "_sopen",
    "_creat",
    "_umask",
    "_chmod",
    "_setmode",
    "_read",
    "_write",
    "_lseek",
    "_tell",
    "_close",
    "_stat",
    "GetModuleFileNameA",
    "GetModuleHandleA",
    "GetSystemDirectoryA",
    "GetWindowsDirectoryA",
    "GetVersionExA",
    "GetSystemDefaultLangID",
    "GetLocalTime",
    "LoadLibraryA",
    "GetProcAddress",
    "FreeLibrary",
    "GetDiskFreeSpaceA",
    "GlobalAlloc",
    "GlobalLock",
    "GlobalUnlock",
    "GlobalFree",
    "RegOpenKeyExA",
    "RegCreateKeyExA",
    "RegQueryValueExA",
    "RegSetValueExA",
    "RegDeleteKeyA",
    "RegDeleteValueA",
    "RegEnumKeyA",
    "RegCloseKey",
    "LoadStringA",
    "MessageBoxA",
    "GetDlgItem",
    "SendMessageA",
    "PeekMessageA",
    "TranslateMessage",
    "DispatchMessageA",
    "GetDiskFreeSpaceExA",
    "GetFileVersionInfoSizeA",
    "GetFileVersionInfoA",
    "VerQueryValueA",
};

inline bool IsSeamFunction(std::string_view name) {
  return std::ranges::find(kSeamFunctions, name) != std::ranges::end(kSeamFunctions);
}

}  // namespace machine

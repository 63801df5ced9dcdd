#include "package/paths.h"
#include "platform/text.h"

int FileExists(const char* path) {
  if (IsMissingOrEmpty(path)) return 0;
  const DWORD attributes = GetFileAttributesA(path);
  return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
}

int DirectoryExists(const char* path) {
  if (IsMissingOrEmpty(path)) return 0;
  const DWORD attributes = GetFileAttributesA(path);
  return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

StatusCode DeleteFileChecked(const char* path) {
  if (IsMissingOrEmpty(path)) return StatusBadArgument;
  return DeleteFileA(path) == TRUE ? 1 : 0;
}

StatusCode RemoveDirectoryChecked(const char* path) {
  if (IsMissingOrEmpty(path)) return StatusBadArgument;
  return RemoveDirectoryA(path) == TRUE ? 1 : 0;
}

int AppendBackslash(char* text, size_t size) {
  if (IsMissingOrEmpty(text) || text[strlen(text) - 1] == '\\') return 0;
  return AppendText(text, size, "\\") ? 1 : 0;
}

int GetWindowsDir(char* buffer, size_t size) {
  static char kept[kPathSize];
  if (buffer == nullptr || size == 0) return 0;
  if (kept[0] == '\0') {
    // The answer is the length, or the size wanted when the buffer is too small.
    const UINT length = GetWindowsDirectoryA(kept, sizeof(kept));
    if (length >= sizeof(kept)) kept[0] = '\0';
  }
  if (kept[0] == '\0') return 0;
  return CopyText(buffer, size, kept) ? 1 : 0;
}

HINSTANCE ModuleHandle() {
  static HINSTANCE module = GetModuleHandleA(nullptr);
  return module;
}

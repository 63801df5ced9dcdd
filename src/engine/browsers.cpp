#include "engine/browsers.h"

#include <cstring>

#include "package/paths.h"
#include "platform/registry_key.h"
#include "platform/text.h"

namespace {

constexpr char kNavigatorKey[] = "SOFTWARE\\Netscape\\Netscape Navigator";
constexpr char kAppPathsKey[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\App Paths";
constexpr size_t kKeySize = 780;

using RegistryText = char[kPathSize];

bool ReadText(const char* subkey, const char* name, RegistryText& text) {
  memset(text, 0, sizeof(text));
  DWORD count = sizeof(text);
  return ReadRegistryValue(HKEY_LOCAL_MACHINE, subkey, name, text, &count) == 1;
}

int CopyResult(char* buffer, int32_t size, const char* text) {
  return size > 0 && CopyText(buffer, static_cast<size_t>(size), text) ? 1 : 0;
}

// Through the directory that the system knows for the browser's executable.
int FindByAppPath(const char* executable, char* buffer, int32_t size) {
  char key[kKeySize] = {};
  RegistryText directory;
  char plugins[kKeySize] = {};
  if (!FormatText(key, sizeof(key), "%s\\%s", kAppPathsKey, executable) ||
      !ReadText(key, "Path", directory) || CleanAppPath(directory) != 1) {
    return 0;
  }
  // AppendBackslash has no room behind a directory of 259 characters.
  const char* separator = directory[strlen(directory) - 1] == '\\' ? "" : "\\";
  (void)FormatText(plugins, sizeof(plugins), "%s%sPlugins", directory, separator);
  return CopyResult(buffer, size, plugins);
}

}  // namespace

int ReadRegistryValue(HKEY root, const char* subkey, const char* name, char* data, DWORD* count) {
  if (IsMissingOrEmpty(subkey) || data == nullptr || count == nullptr || *count == 0) return 0;
  const DWORD size = *count;
  RegistryKey key;
  if (!key.Open(root, subkey, KEY_READ)) return 0;
  if (RegQueryValueExA(key.get(), name, nullptr, nullptr, reinterpret_cast<BYTE*>(data), count) !=
      ERROR_SUCCESS) {
    return 0;
  }
  return *count < size || memchr(data, '\0', size) != nullptr ? 1 : 0;
}

int CleanAppPath(char* path) {
  if (IsMissingOrEmpty(path)) return 0;
  char first[kPathSize] = {};
  if (!CopyText(first, path)) return 0;
  if (char* semicolon = strchr(first, ';')) *semicolon = '\0';
  if (DirectoryExists(first) != 1) return 0;
  return CopyText(path, strlen(path) + 1, first) ? 1 : 0;
}

int FindNetscapePluginDir(char* buffer, int32_t size) {
  if (buffer == nullptr) return 0;
  RegistryText value;
  char key[kKeySize] = {};
  if (ReadText(kNavigatorKey, "CurrentVersion", value) &&
      FormatText(key, sizeof(key), "%s\\%s\\%s", kNavigatorKey, value, "Main") &&
      ReadText(key, "Plugins Directory", value)) {
    // Taken exactly as it stands. One that doesn't fit ends the search.
    return CopyResult(buffer, size, value);
  }
  return FindByAppPath("Netscape.exe", buffer, size);
}

int FindExplorerPluginDir(char* buffer, int32_t size) {
  return buffer != nullptr ? FindByAppPath("Iexplore.exe", buffer, size) : 0;
}

int FindOperaPluginDir(char* buffer, int32_t size) {
  return buffer != nullptr ? FindByAppPath("Opera.exe", buffer, size) : 0;
}

#include "registration/uninstall_entries.h"

#include "package/paths.h"
#include "platform/registry_key.h"
#include "platform/text.h"
#include "registration/cleanup_script.h"
#include "registration/removal_program.h"
#include "ui/catalog.h"

namespace {

constexpr char kUninstallKey[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\Uninstall";
constexpr char kRunOnceKey[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\RunOnce";
constexpr char kRunOnceValue[] = "MorivCommand";
constexpr size_t kKeySize = 2 * kCatalogTextSize;
constexpr size_t kCommandSize = 520;

// These texts are stored with their NUL.
bool SetTerminatedText(const RegistryKey& key, const char* name, const char* text) {
  return key.SetText(name, text, static_cast<DWORD>(strlen(text) + 1));
}

// False for a name that can't be had: an empty one would stand for the list itself.
bool LoadEntryName(char (&name)[kCatalogTextSize]) {
  LoadCatalogText(nullptr, CatalogUninstallKey, name);
  return name[0] != '\0';
}

// That of the 9x family ends in a blank.
bool FormatRunOnceCommand(const char* infPath, char* command, size_t size) {
  OSVERSIONINFOA version = {};
  version.dwOSVersionInfoSize = sizeof(version);
  GetVersionExA(&version);
  char directory[kPathSize] = {};
  const bool isNt = version.dwPlatformId == VER_PLATFORM_WIN32_NT;
  const UINT length = isNt ? GetSystemDirectoryA(directory, sizeof(directory))
                           : GetWindowsDirectoryA(directory, sizeof(directory));
  if (length == 0 || length >= sizeof(directory)) return false;
  return isNt ? FormatText(command, size, "%s\\%s %s %s %s", directory,
                           "rundll32.exe setupapi.dll,InstallHinfSection", kCleanupSection, "132",
                           infPath)
              : FormatText(command, size, "%s\\%s %s %s %s ", directory,
                           "rundll.exe setupx.dll,InstallHinfSection", kCleanupSection, "132",
                           infPath);
}

}  // namespace

int WriteUninstallEntry(const SetupContext* context) {
  (void)CancelRunOnceCommand();
  char name[kCatalogTextSize] = {};
  char keyPath[kKeySize] = {};
  char path[kRemovalProgramPathSize] = {};
  RegistryKey key;
  if (!LoadEntryName(name) || !FindRemovalProgramPath(path) ||
      !FormatText(keyPath, sizeof(keyPath), "%s\\%s", kUninstallKey, name) ||
      !key.Create(HKEY_LOCAL_MACHINE, keyPath)) {
    return 0;
  }

  char displayName[kCatalogTextSize] = {};
  LoadCatalogText(context, CatalogDisplayName, displayName);
  if (!SetTerminatedText(key, "DisplayName", displayName)) return 0;

  // The path alone, without quotes or switches: the removal program's own header tells it what to
  // do.
  return SetTerminatedText(key, "UninstallString", path);
}

int DeleteUninstallEntry() {
  RegistryKey key;
  if (!key.Open(HKEY_LOCAL_MACHINE, kUninstallKey, KEY_ALL_ACCESS)) return 0;
  char name[kCatalogTextSize] = {};
  return LoadEntryName(name) && RegDeleteKeyA(key.get(), name) == ERROR_SUCCESS;
}

int ScheduleFinalCleanup() {
  char path[kPathSize] = {};
  return WriteCleanupScript(path, sizeof(path)) == 1 && WriteRunOnceCommand(path) == 1;
}

int WriteRunOnceCommand(const char* infPath) {
  if (IsMissingOrEmpty(infPath)) return 0;
  char command[kCommandSize] = {};
  if (!FormatRunOnceCommand(infPath, command, sizeof(command))) return 0;
  RegistryKey key;
  return key.Create(HKEY_LOCAL_MACHINE, kRunOnceKey) &&
         SetTerminatedText(key, kRunOnceValue, command);
}

int CancelRunOnceCommand() {
  RegistryKey key;
  return key.Create(HKEY_LOCAL_MACHINE, kRunOnceKey) &&
         RegDeleteValueA(key.get(), kRunOnceValue) == ERROR_SUCCESS;
}

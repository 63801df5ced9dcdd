#include "machine/machine.h"

#include "machine/code_page.h"
#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/open_files.h"
#include "machine/open_objects.h"
#include "machine/registry_store.h"
#include "machine/scripted_user.h"

namespace fs = std::filesystem;

namespace machine {
namespace {

constexpr char kSettingsFile[] = "machine.ini";
constexpr char kRegistryFile[] = "registry.reg";
constexpr char kSystemDrive[] = "drive_c";

Settings currentSettings;
fs::path currentFolder;  // absolute; empty when no machine runs

void Close() {
  ForgetUser();
  ResetFiles();
  CloseRegistry();
  CloseDrives();
  SetFaults({});
  ForgetOpenObjects();
  currentSettings = Settings{};
  UseCodePage(currentSettings.codePage);
  currentFolder.clear();
}

bool MakeHostDirectory(const fs::path& directory, std::string* error) {
  std::error_code failure;
  fs::create_directories(directory, failure);
  if (!failure && fs::is_directory(directory, failure)) return true;
  *error = directory.string() +
           ": cannot be made: " + (failure ? failure.message() : "it is no directory");
  return false;
}

// Opens what the folder holds; a part that is missing has its defaults.
bool Open(const fs::path& folder, const fs::path& image, std::string* error) {
  std::error_code failure;
  currentFolder = fs::canonical(folder, failure);
  if (failure) {
    *error = folder.string() + ": " + failure.message();
    return false;
  }

  if (!ReadSettings(currentFolder / kSettingsFile, &currentSettings, error)) {
    *error = (currentFolder / *error).string();
    return false;
  }
  // The file is UTF-8, and only now is it known what code page the program has.
  UseCodePage(currentSettings.codePage);
  currentSettings.windowsDirectory = FromUtf8(currentSettings.windowsDirectory);
  currentSettings.systemDirectory = FromUtf8(currentSettings.systemDirectory);

  if (!LoadRegistry(currentFolder / kRegistryFile, error)) {
    *error = (currentFolder / *error).string();
    return false;
  }
  OpenDrives(currentFolder, image);
  return true;
}

// Makes every directory of a path that is missing. What can't be made, for a drive that is not
// there or a name that can't be, stays away: the machine has no such directory.
void MakeDirectories(const std::string& dosPath) {
  for (size_t end = dosPath.find('\\', 3);; end = dosPath.find('\\', end + 1)) {
    const auto location = Locate(dosPath.substr(0, end));
    if (!location) return;
    std::error_code failure;
    if (!location->exists && location->parentExists) fs::create_directory(location->host, failure);
    if (end == std::string::npos) return;
  }
}

bool IsFresh() {
  std::error_code failure;
  return !fs::exists(currentFolder / kRegistryFile, failure) ||
         !fs::exists(currentFolder / kSystemDrive, failure);
}

bool Furnish(std::string* error) {
  if (!MakeHostDirectory(currentFolder / kSystemDrive, error)) return false;
  MakeDirectories(currentSettings.windowsDirectory);
  MakeDirectories(currentSettings.systemDirectory);
  MakeDirectories("C:\\Program Files");
  std::error_code failure;
  if (!fs::exists(currentFolder / kRegistryFile, failure)) SaveRegistry();
  return true;
}

}  // namespace

bool Start(const fs::path& folder, const fs::path& image, std::string* error) {
  if (!MakeHostDirectory(folder, error) || !Open(folder, image, error) ||
      (IsFresh() && !Furnish(error))) {
    Close();
    return false;
  }
  SetFaults(currentSettings.faults);
  return true;
}

bool StartAsItIs(const fs::path& folder, std::string* error) {
  if (Open(folder, fs::path(), error)) return true;
  Close();
  return false;
}

std::string Stop() {
  std::string open = OpenObjects();
  Close();
  return open;
}

Settings& CurrentSettings() {
  return currentSettings;
}

const fs::path& Folder() {
  return currentFolder;
}

bool MakeFresh(const fs::path& folder, std::string* error) {
  const bool made =
      MakeHostDirectory(folder, error) && Open(folder, fs::path(), error) && Furnish(error);
  Close();
  return made;
}

}  // namespace machine

// A path is looked up name by name, from its drive's folder down. Nothing of the host but folders
// and plain files is seen, and no link that leads out of the machine's folder.
#include "machine/drives.h"

#include <sys/stat.h>

#include <algorithm>

#include "machine/code_page.h"
#include "machine/dos_path.h"
#include "machine/folder_names.h"
#include "machine/machine.h"

namespace fs = std::filesystem;

namespace machine {
namespace {

constexpr char kImageDrive = 'Z';
constexpr size_t kPathLimit = MAX_PATH;  // a full path with its NUL

fs::path machineFolder;  // canonical; empty when no machine runs
fs::path imageFile;      // canonical; empty without a program
FileIdentity imageIdentity;
std::string imageDosPath;

fs::path DriveFolder(char drive) {
  return machineFolder / (std::string("drive_") + static_cast<char>(drive | 0x20));
}

// The path from `folder` down to `file`; nullopt when it lies elsewhere. Both are canonical.
std::optional<fs::path> PathBelow(const fs::path& folder, const fs::path& file) {
  const auto [rest, end] = std::mismatch(file.begin(), file.end(), folder.begin(), folder.end());
  if (end != folder.end()) return std::nullopt;
  fs::path below;
  std::for_each(rest, file.end(), [&below](const fs::path& name) { below /= name; });
  return below;
}

// The image has a drive of its own when it lies in no drive's folder.
bool IsImageDrive(char drive) {
  return drive == kImageDrive && imageDosPath.starts_with("Z:\\") &&
         !PathBelow(DriveFolder(kImageDrive), imageFile);
}

// What stands at a place on the host, also through a link that stays inside the machine.
struct HostEntry {
  enum Kind { kNothing, kFile, kDirectory, kOutOfReach };
  Kind kind = kNothing;
  struct stat status = {};
};

bool LeadsOut(const fs::path& link) {
  std::error_code error;
  const fs::path target = fs::canonical(link, error);
  return error || !PathBelow(machineFolder, target);
}

HostEntry LookAt(const fs::path& path) {
  HostEntry entry;
  if (lstat(path.c_str(), &entry.status) != 0) return entry;
  const bool isLink = S_ISLNK(entry.status.st_mode);
  if (isLink && (LeadsOut(path) || stat(path.c_str(), &entry.status) != 0)) {
    entry.kind = HostEntry::kOutOfReach;
  } else if (S_ISDIR(entry.status.st_mode)) {
    entry.kind = HostEntry::kDirectory;
  } else {
    entry.kind = S_ISREG(entry.status.st_mode) ? HostEntry::kFile : HostEntry::kOutOfReach;
  }
  return entry;
}

bool DriveExists(char drive) {
  return LookAt(DriveFolder(drive)).kind == HostEntry::kDirectory;
}

FileIdentity IdentityOf(const struct stat& status) {
  return {.device = status.st_dev, .inode = status.st_ino};
}

void Describe(Location& location, const HostEntry& entry) {
  location.exists = entry.kind != HostEntry::kNothing;
  if (!location.exists) return;
  location.isDirectory = entry.kind == HostEntry::kDirectory;
  location.isReadOnly = (entry.status.st_mode & S_IWUSR) == 0;
  location.size = static_cast<uint64_t>(entry.status.st_size);
  location.identity = IdentityOf(entry.status);
  location.isImage = !imageFile.empty() && location.identity == imageIdentity;
}

// The drive holds the image and nothing else.
std::optional<Location> LocateOnImageDrive(const DosPath& path, Location location) {
  location.isRoot = path.names.empty();
  location.parentExists = path.names.size() <= 1;
  location.exists = location.isDirectory = location.isRoot;
  const bool isImage =
      path.names.size() == 1 && EqualNoCase(path.names[0], FromUtf8(imageFile.filename().string()));
  if (!isImage) return location;
  if (location.endsInSeparator) return std::nullopt;
  location.host = imageFile;
  Describe(location, LookAt(imageFile));
  return location;
}

// The entry of that name in any case; its path goes into `host`, as it is spelled there.
HostEntry Find(const fs::path& folder, const std::string& name, fs::path& host) {
  host = folder / ToUtf8(name);
  const HostEntry entry = LookAt(host);
  if (entry.kind != HostEntry::kNothing) return entry;
  const std::string spelling = FindSpelling(folder, name);
  if (spelling.empty()) return entry;
  host = folder / spelling;
  return LookAt(host);
}

std::optional<Location> LocateInFolder(const DosPath& path, Location location) {
  location.host = DriveFolder(path.drive);
  HostEntry entry = LookAt(location.host);
  if (entry.kind != HostEntry::kDirectory) return std::nullopt;
  location.isRoot = path.names.empty();
  location.parentExists = true;
  for (const std::string& name : path.names) {
    location.parentExists = entry.kind == HostEntry::kDirectory;
    const fs::path folder = location.host;
    if (location.parentExists) {
      entry = Find(folder, name, location.host);
    } else {
      entry = {};
      location.host /= ToUtf8(name);
    }
    if (entry.kind == HostEntry::kOutOfReach) return std::nullopt;
  }
  if (entry.kind == HostEntry::kFile && location.endsInSeparator) return std::nullopt;
  Describe(location, entry);
  return location;
}

// The image's path as the program sees it: on the drive whose folder holds it, else on Z:.
std::string FindImagePath() {
  for (char drive = 'A'; drive <= 'Z'; ++drive) {
    const auto below = PathBelow(DriveFolder(drive), imageFile);
    if (!below || !DriveExists(drive)) continue;
    std::string path{drive, ':'};
    for (const fs::path& name : *below) path += '\\' + FromUtf8(name.string());
    return path;
  }
  return std::string{kImageDrive, ':', '\\'} + FromUtf8(imageFile.filename().string());
}

}  // namespace

std::optional<Location> Locate(std::string_view dosPath) {
  if (machineFolder.empty()) return std::nullopt;
  const std::optional<DosPath> path = ParseDosPath(dosPath);
  if (!path || FullLength(*path) >= kPathLimit) return std::nullopt;
  Location location;
  location.drive = path->drive;
  location.endsInSeparator = path->endsInSeparator;
  location.dosLength = FullLength(*path);
  return IsImageDrive(path->drive) ? LocateOnImageDrive(*path, location)
                                   : LocateInFolder(*path, location);
}

std::optional<fs::path> LocateFile(std::string_view dosPath) {
  const std::optional<Location> location = Locate(dosPath);
  if (!location || !location->exists || location->isDirectory) return std::nullopt;
  return location->host;
}

bool IsReadOnlyDrive(char drive) {
  const auto& disks = CurrentSettings().disks;
  const auto disk = disks.find(drive);
  return IsImageDrive(drive) || (disk != disks.end() && disk->second.readOnly);
}

std::string ImagePath() {
  return imageDosPath;
}

void OpenDrives(const fs::path& folder, const fs::path& image) {
  std::error_code error;
  machineFolder = fs::canonical(folder, error);
  imageFile = image.empty() ? fs::path() : fs::weakly_canonical(image, error);
  imageIdentity = IdentityOf(LookAt(imageFile).status);
  imageDosPath = imageFile.empty() ? "" : FindImagePath();
}

void CloseDrives() {
  ForgetFolders();
  machineFolder.clear();
  imageFile.clear();
  imageIdentity = {};
  imageDosPath.clear();
}

}  // namespace machine

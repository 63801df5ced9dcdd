// A path is looked up name by name, from its drive's folder down. Nothing of the host but folders
// and plain files is seen, and no link that leads out of the machine's folder.
#include "machine/drives.h"

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

// What stands there: a regular file or a directory, also through a link that stays inside the
// machine; not_found for nothing; none for what the program can't reach.
fs::file_type TypeOf(const fs::path& path) {
  std::error_code error;
  fs::file_type type = fs::symlink_status(path, error).type();
  if (type == fs::file_type::none) return fs::file_type::not_found;  // too long for the host
  if (type == fs::file_type::symlink) {
    const fs::path target = fs::canonical(path, error);
    if (error || !PathBelow(machineFolder, target)) return fs::file_type::none;
    type = fs::status(path, error).type();
  }
  const bool isKnown = type == fs::file_type::regular || type == fs::file_type::directory ||
                       type == fs::file_type::not_found;
  return isKnown ? type : fs::file_type::none;
}

bool DriveExists(char drive) {
  return TypeOf(DriveFolder(drive)) == fs::file_type::directory;
}

std::optional<Location> LocateOnImageDrive(const DosPath& path, Location location) {
  location.isRoot = path.names.empty();
  location.parentExists = path.names.size() <= 1;
  location.isImage =
      path.names.size() == 1 && EqualNoCase(path.names[0], FromUtf8(imageFile.filename().string()));
  location.exists = location.isRoot || location.isImage;
  if (location.isImage) location.host = imageFile;
  if (location.isImage && location.endsInSeparator) return std::nullopt;
  return location;
}

std::optional<Location> LocateInFolder(const DosPath& path, Location location) {
  if (!DriveExists(path.drive)) return std::nullopt;
  location.host = DriveFolder(path.drive);
  location.isRoot = path.names.empty();
  location.parentExists = true;
  fs::file_type type = fs::file_type::directory;
  for (const std::string& name : path.names) {
    location.parentExists = type == fs::file_type::directory;
    const fs::path folder = location.host;
    location.host /= ToUtf8(name);
    type = location.parentExists ? TypeOf(location.host) : fs::file_type::not_found;
    if (type == fs::file_type::not_found && location.parentExists) {
      const std::string spelling = FindSpelling(folder, name);
      if (!spelling.empty()) {
        location.host = folder / spelling;
        type = TypeOf(location.host);
      }
    }
    if (type == fs::file_type::none) return std::nullopt;
  }
  location.exists = type != fs::file_type::not_found;
  const bool isFile = type == fs::file_type::regular;
  if (isFile && location.endsInSeparator) return std::nullopt;
  std::error_code error;
  location.isImage =
      isFile && !imageFile.empty() && fs::equivalent(location.host, imageFile, error);
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
  std::error_code error;
  if (!location || !location->exists || !fs::is_regular_file(location->host, error)) {
    return std::nullopt;
  }
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
  imageDosPath = imageFile.empty() ? "" : FindImagePath();
}

void CloseDrives() {
  ForgetFolders();
  machineFolder.clear();
  imageFile.clear();
  imageDosPath.clear();
}

}  // namespace machine

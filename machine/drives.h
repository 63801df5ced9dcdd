// Drives and paths: where C:\a\b lies on the host.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>

namespace machine {

// Which file of the host, whatever its path.
struct FileIdentity {
  dev_t device = 0;
  ino_t inode = 0;
  bool operator==(const FileIdentity&) const = default;
};

struct Location {
  char drive = 0;                // upper-case letter
  std::filesystem::path host;    // host path; its last element keeps the case on disk, or the
                                 // case given when there is none
  bool isRoot = false;           // the drive itself
  bool parentExists = false;     // and is a directory
  bool endsInSeparator = false;  // only a directory can stand there
  size_t dosLength = 0;          // characters of the full DOS path, for the length limits

  // What stands there, as it was when it was looked up.
  bool exists = false;
  bool isDirectory = false;
  bool isImage = false;     // the running program's file
  bool isReadOnly = false;  // the attribute, which is the owner's write permission on the host
  uint64_t size = 0;        // bytes
  FileIdentity identity;
};

// Where a path of the program leads. nullopt for a path that exists nowhere and can't be made: a
// missing drive, a bad name, a device name, too long a path, a way out of the machine's folder.
std::optional<Location> Locate(std::string_view dosPath);

// Host path of an existing file, for readers that need no Win32 handle (version data).
std::optional<std::filesystem::path> LocateFile(std::string_view dosPath);

// Whether nothing on the drive can be written, made or deleted: by its settings, or as the drive of
// the image.
bool IsReadOnlyDrive(char drive);

// Full DOS path of the running program, "" when there is none.
std::string ImagePath();

// Called by Start and Stop.
void OpenDrives(const std::filesystem::path& folder, const std::filesystem::path& image);
void CloseDrives();

}  // namespace machine

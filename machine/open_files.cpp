#include "machine/open_files.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <map>

#include "machine/disk_room.h"
#include "machine/dos_path.h"
#include "machine/file_attributes.h"
#include "machine/host_file.h"
#include "machine/machine.h"

namespace machine {
namespace {

constexpr int kFirstNumber = 3;
constexpr char kNoDrive = '\0';  // of a device

std::map<int, OpenFile> openFiles;
int permissionMask = 0;

// Each of two open files must share what the other is opened for.
bool Conflict(const OpenMode& a, const OpenMode& b) {
  return (a.access & ~b.share) != 0 || (b.access & ~a.share) != 0;
}

// How the system itself holds the running image. The NT family maps it and closes the file: others
// may open it exclusively, but not for writing. The 9x family keeps it open for reading.
OpenMode ImageHold() {
  return {.access = CurrentSettings().ntFamily ? 0 : kRead, .share = kRead};
}

bool IsRefusedByHolders(const Location& location, const OpenMode& mode) {
  if (location.isImage && Conflict(mode, ImageHold())) return true;
  return std::ranges::any_of(openFiles, [&](const auto& entry) {
    return entry.second.identity == location.identity && Conflict(mode, entry.second.mode);
  });
}

bool Writes(const OpenMode& mode) {
  return mode.create || (mode.access & kWrite) != 0;
}

bool CanOpen(const Location& location, const OpenMode& mode) {
  const bool writes = Writes(mode);
  if (location.isRoot || (writes && IsReadOnlyDrive(location.drive))) return false;
  if (!location.exists) return mode.create && location.parentExists && !location.endsInSeparator;
  if (location.isDirectory || (writes && location.isReadOnly)) return false;
  // To cut a file is to write it, whatever the access asked for.
  OpenMode asked = mode;
  if (writes) asked.access |= kWrite;
  return !IsRefusedByHolders(location, asked);
}

int HostFlags(DWORD access) {
  switch (access & (kRead | kWrite)) {
    case kRead | kWrite:
      return O_RDWR | O_CLOEXEC;
    case kWrite:
      return O_WRONLY | O_CLOEXEC;
    default:
      return O_RDONLY | O_CLOEXEC;
  }
}

// A file that has other names on the host may be somebody's outside the machine.
bool HasOneName(int host) {
  struct stat status;
  return fstat(host, &status) == 0 && status.st_nlink <= 1;
}

// A host descriptor on a file that is there, or else on a new one, to write it.
int OpenToWrite(const Location& location, const OpenMode& mode) {
  int flags = HostFlags(mode.access | kWrite);
  if (mode.create) flags |= location.exists ? O_CREAT : O_CREAT | O_NOFOLLOW;
  const int host = open(location.host.c_str(), flags, 0666);
  // It is cut only when it is known to be the machine's alone.
  if (host < 0 || (HasOneName(host) && (!mode.create || ftruncate(host, 0) == 0))) return host;
  close(host);
  return -1;
}

// A host descriptor on the file, cut or made if the mode says so; -1 when it is refused.
int OpenOnHost(const Location& location, const OpenMode& mode) {
  if (!Writes(mode)) return open(location.host.c_str(), HostFlags(mode.access));
  const int host = OpenToWrite(location, mode);
  if (host < 0 || !mode.create) return host;
  GiveRoomBack(location.drive, location.size);
  MarkProgram(location.host);
  if (mode.readOnly) SetReadOnly(location.host, true);
  return host;
}

int FreeNumber() {
  int number = kFirstNumber;
  while (openFiles.contains(number)) ++number;
  return number;
}

// Bytes by which a write of `count` at `position` makes the file longer; nullopt when the host's
// positions end before it.
std::optional<uint64_t> Growth(uint64_t size, uint64_t position, uint64_t count) {
  if (count > static_cast<uint64_t>(INT64_MAX) - position) return std::nullopt;
  return std::max(size, position + count) - size;
}

// The program's number for a host's descriptor, which it owns from now on; -1 for none.
int Enter(ObjectKind kind, const OpenMode& mode, char drive, int host) {
  struct stat status;
  if (host < 0 || fstat(host, &status) != 0) return -1;
  const int number = FreeNumber();
  openFiles.emplace(number, OpenFile{.kind = kind,
                                     .mode = mode,
                                     .drive = drive,
                                     .identity = {status.st_dev, status.st_ino},
                                     .host = host,
                                     .size = static_cast<uint64_t>(status.st_size)});
  ObjectOpened(kind);
  return number;
}

}  // namespace

int OpenProgramFile(ObjectKind kind, std::string_view dosPath, const OpenMode& mode) {
  if (IsNullDevicePath(dosPath)) {
    return Enter(kind, mode, kNoDrive, open("/dev/null", HostFlags(mode.access)));
  }
  const std::optional<Location> location = Locate(dosPath);
  if (!location || !CanOpen(*location, mode)) return -1;
  return Enter(kind, mode, location->drive, OpenOnHost(*location, mode));
}

OpenFile* FindOpenFile(int number, ObjectKind kind) {
  const auto entry = openFiles.find(number);
  return entry == openFiles.end() || entry->second.kind != kind ? nullptr : &entry->second;
}

bool CloseOpenFile(int number, ObjectKind kind) {
  const OpenFile* const file = FindOpenFile(number, kind);
  if (file == nullptr) return false;
  close(file->host);
  openFiles.erase(number);
  ObjectClosed(kind);
  return true;
}

int& PermissionMask() {
  return permissionMask;
}

void ResetFiles() {
  while (!openFiles.empty()) {
    const auto& [number, file] = *openFiles.begin();
    CloseOpenFile(number, file.kind);
  }
  permissionMask = 0;
}

bool IsHeldOpen(const Location& location) {
  return IsRefusedByHolders(location, {.access = kDelete, .share = kRead | kWrite | kDelete});
}

uint64_t FileSize(const OpenFile& file) {
  struct stat status;
  return fstat(file.host, &status) == 0 ? static_cast<uint64_t>(status.st_size) : 0;
}

std::optional<int64_t> MovePosition(OpenFile& file, int64_t distance, DWORD origin, int64_t limit) {
  int64_t position = 0;
  if (origin == FILE_CURRENT) {
    position = file.position;
  } else if (origin == FILE_END) {
    position = static_cast<int64_t>(FileSize(file));
  } else if (origin != FILE_BEGIN) {
    return std::nullopt;
  }
  if (__builtin_add_overflow(position, distance, &position)) return std::nullopt;
  if (position < 0 || position > limit) return std::nullopt;
  file.position = position;
  return position;
}

std::optional<size_t> ReadBytes(OpenFile& file, void* buffer, size_t count) {
  if ((file.mode.access & kRead) == 0) return std::nullopt;
  size_t done = 0;
  while (done < count) {
    const ssize_t got =
        pread(file.host, static_cast<char*>(buffer) + done, count - done, file.position);
    if (got < 0) return std::nullopt;
    if (got == 0) break;
    done += static_cast<size_t>(got);
    file.position += got;
  }
  return done;
}

bool WriteBytes(OpenFile& file, const void* buffer, size_t count) {
  if ((file.mode.access & kWrite) == 0) return false;
  if (count == 0) return true;
  if ((file.mode.share & kWrite) != 0) file.size = FileSize(file);
  const auto growth = Growth(file.size, static_cast<uint64_t>(file.position), count);
  if (!growth || !TakeRoom(file.drive, *growth)) return false;
  if (WriteAt(file.host, {static_cast<const char*>(buffer), count}, file.position)) {
    file.position += static_cast<int64_t>(count);
    file.size += *growth;
    return true;
  }

  // The host's own disk is full: undo what went through.
  if (ftruncate(file.host, static_cast<off_t>(file.size)) == 0) {
    GiveRoomBack(file.drive, *growth);
  }
  return false;
}

}  // namespace machine

// The files that the program holds open, through handles and descriptors alike, and the rules of
// sharing between them.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "machine/drives.h"
#include "machine/open_objects.h"
#include "platform/win32.h"

namespace machine {

// Sets of these: what an open file is opened for, and what it lets others open it for. The values
// are those of FILE_SHARE_READ and its companions.
inline constexpr DWORD kRead = 1;
inline constexpr DWORD kWrite = 2;
inline constexpr DWORD kDelete = 4;

struct OpenMode {
  DWORD access = 0;
  DWORD share = 0;
  bool create = false;    // cut an existing file to nothing or make a new one
  bool readOnly = false;  // with create: the file gets the read-only attribute
};

struct OpenFile {
  ObjectKind kind;  // kFile for a handle, kDescriptor for a descriptor
  OpenMode mode;
  char drive;
  FileIdentity identity;
  int host;              // the host's descriptor, owned
  int64_t position = 0;  // the program's; the host's own is not used
  uint64_t size = 0;     // as last seen; the file's own while nobody else may write it
  bool text = false;     // a descriptor that writes LF as CR LF
};

// Opens a file of the program's. Refuses what Windows refuses: directories, writing a read-only
// file or drive, what another open file does not share, what the system does with the running
// image; and writing a file that has a second name on the host. Returns its number, which
// CloseOpenFile ends, or -1. Numbers are small and at least 3: the lower ones are the standard
// streams'.
int OpenProgramFile(ObjectKind kind, std::string_view dosPath, const OpenMode& mode);

// Null for a number that is not open or not of that kind.
OpenFile* FindOpenFile(int number, ObjectKind kind);

// False for a number that is not open or not of that kind.
bool CloseOpenFile(int number, ObjectKind kind);

// The permissions that _creat withholds from a new file, as _umask sets them.
int& PermissionMask();

// The state of a program that starts: nothing open, nothing withheld.
void ResetFiles();

// Whether the file can be deleted as far as those who hold it open go.
bool IsHeldOpen(const Location& location);

uint64_t FileSize(const OpenFile& file);

// Moves the position to `distance` bytes from an origin (FILE_BEGIN, FILE_CURRENT, FILE_END; the
// runtime's SEEK_SET, SEEK_CUR, SEEK_END have the same values). Returns the new position; nullopt,
// with the position where it was, when it would be negative or above `limit`.
std::optional<int64_t> MovePosition(OpenFile& file, int64_t distance, DWORD origin, int64_t limit);

// Returns the bytes read, fewer than `count` only at the end of the file; nullopt on failure.
std::optional<size_t> ReadBytes(OpenFile& file, void* buffer, size_t count);

// Writes all or nothing. A gap behind the old end is filled with zeros. False on a full disk.
bool WriteBytes(OpenFile& file, const void* buffer, size_t count);

}  // namespace machine

// The Win32 file functions, over the drives of the machine.
#include <fcntl.h>
#include <sys/stat.h>

#include <array>
#include <cstring>

#include "machine/disk_room.h"
#include "machine/dos_path.h"
#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/file_attributes.h"
#include "machine/open_files.h"
#include "machine/process_handles.h"
#include "platform/win32.h"

namespace fs = std::filesystem;
using machine::CallFails;
using machine::IsReadOnlyDrive;
using machine::Locate;
using machine::Location;
using machine::ObjectKind;
using machine::OpenFile;
using machine::OpenMode;
using machine::TransferFails;

namespace {

// A path of 248 characters or more leaves no room for a short file name in the directory.
constexpr size_t kDirectoryPathLimit = 248;

constexpr DWORD kShareAll = machine::kRead | machine::kWrite | machine::kDelete;

// Real handles are multiples of 4 too.
HANDLE HandleOf(int number) {
  return reinterpret_cast<HANDLE>(static_cast<intptr_t>(number) * 4);
}

int NumberOf(HANDLE handle) {
  const auto value = reinterpret_cast<intptr_t>(handle);
  return value > 0 && value % 4 == 0 && value / 4 <= INT32_MAX ? static_cast<int>(value / 4) : -1;
}

OpenFile* FileOf(HANDLE handle) {
  return machine::FindOpenFile(NumberOf(handle), ObjectKind::kFile);
}

std::string_view PathOf(LPCSTR text) {
  return text == nullptr ? "" : text;
}

bool DeleteLocated(const Location& location, uint64_t size) {
  std::error_code error;
  if (!fs::remove(location.host, error)) return false;
  machine::GiveRoomBack(location.drive, size);
  return true;
}

bool CopyBytes(OpenFile& from, OpenFile& to) {
  std::array<char, 65536> block;
  for (;;) {
    const auto count = machine::ReadBytes(from, block.data(), block.size());
    if (!count || !machine::WriteBytes(to, block.data(), *count)) return false;
    if (*count < block.size()) return true;
  }
}

void CopyTime(const OpenFile& from, const OpenFile& to) {
  struct stat status;
  if (fstat(from.host, &status) != 0) return;
  const struct timespec times[] = {status.st_atim, status.st_mtim};
  futimens(to.host, times);
}

// Copies into a target that is open already. A copy that fails leaves no target, as on Windows.
bool FillTarget(int source, int target, const Location& from, const Location& to) {
  OpenFile* const input = machine::FindOpenFile(source, ObjectKind::kFile);
  OpenFile* const output = machine::FindOpenFile(target, ObjectKind::kFile);
  if (!CopyBytes(*input, *output)) {
    DeleteLocated(to, machine::FileSize(*output));
    return false;
  }
  CopyTime(*input, *output);
  return machine::SetReadOnly(to.host, from.isReadOnly);
}

}  // namespace

extern "C" {

// Of the dispositions only CREATE_ALWAYS and OPEN_EXISTING, of the attributes only the read-only
// one mean something here. No directory is opened, not even with the flag that lets Windows do it.
HANDLE CreateFileA(LPCSTR name, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES, DWORD disposition,
                   DWORD flags, HANDLE) {
  if (CallFails("CreateFileA")) return INVALID_HANDLE_VALUE;
  if (disposition != CREATE_ALWAYS && disposition != OPEN_EXISTING) return INVALID_HANDLE_VALUE;
  OpenMode mode;
  if ((access & GENERIC_READ) != 0) mode.access |= machine::kRead;
  if ((access & GENERIC_WRITE) != 0) mode.access |= machine::kWrite;
  mode.share = share & kShareAll;
  mode.create = disposition == CREATE_ALWAYS;
  mode.readOnly = mode.create && (flags & FILE_ATTRIBUTE_READONLY) != 0;
  const int number = machine::OpenProgramFile(ObjectKind::kFile, PathOf(name), mode);
  return number < 0 ? INVALID_HANDLE_VALUE : HandleOf(number);
}

BOOL ReadFile(HANDLE handle, LPVOID buffer, DWORD count, LPDWORD done, OVERLAPPED* overlapped) {
  if (done != nullptr) *done = 0;
  if (TransferFails("ReadFile", &count)) return FALSE;
  OpenFile* const file = FileOf(handle);
  if (file == nullptr || done == nullptr || overlapped != nullptr) return FALSE;
  if (buffer == nullptr && count != 0) return FALSE;
  const auto got = machine::ReadBytes(*file, buffer, count);
  if (!got) return FALSE;
  *done = static_cast<DWORD>(*got);
  return TRUE;
}

BOOL WriteFile(HANDLE handle, LPCVOID buffer, DWORD count, LPDWORD done, OVERLAPPED* overlapped) {
  if (done != nullptr) *done = 0;
  if (TransferFails("WriteFile", &count)) return FALSE;
  OpenFile* const file = FileOf(handle);
  if (file == nullptr || done == nullptr || overlapped != nullptr) return FALSE;
  if (buffer == nullptr && count != 0) return FALSE;
  if (!machine::WriteBytes(*file, buffer, count)) return FALSE;
  *done = count;
  return TRUE;
}

DWORD GetFileSize(HANDLE handle, LPDWORD high) {
  if (CallFails("GetFileSize")) return INVALID_FILE_SIZE;
  const OpenFile* const file = FileOf(handle);
  if (file == nullptr) return INVALID_FILE_SIZE;
  const uint64_t size = machine::FileSize(*file);
  if (high != nullptr) *high = static_cast<DWORD>(size >> 32);
  return static_cast<DWORD>(size);
}

// Without the high word the distance is a signed 32-bit number, and a position that needs more than
// 32 bits is refused.
DWORD SetFilePointer(HANDLE handle, LONG distance, LONG* high, DWORD method) {
  if (CallFails("SetFilePointer")) return INVALID_SET_FILE_POINTER;
  OpenFile* const file = FileOf(handle);
  if (file == nullptr) return INVALID_SET_FILE_POINTER;
  int64_t wide = distance;
  if (high != nullptr) wide = (static_cast<int64_t>(*high) << 32) | static_cast<DWORD>(distance);
  const int64_t limit = high == nullptr ? INVALID_SET_FILE_POINTER - 1 : INT64_MAX;
  const auto position = machine::MovePosition(*file, wide, method, limit);
  if (!position) return INVALID_SET_FILE_POINTER;
  if (high != nullptr) *high = static_cast<LONG>(*position >> 32);
  return static_cast<DWORD>(*position);
}

// A fault makes the answer a failure; the file is closed all the same, as after a failed last
// write.
BOOL CloseHandle(HANDLE handle) {
  const bool fails = CallFails("CloseHandle");
  const bool closed = machine::CloseOpenFile(NumberOf(handle), ObjectKind::kFile) ||
                      machine::CloseProcessHandle(handle);
  return closed && !fails;
}

BOOL DeleteFileA(LPCSTR name) {
  if (CallFails("DeleteFileA")) return FALSE;
  const auto location = Locate(PathOf(name));
  if (!location || !location->exists || location->isDirectory) return FALSE;
  if (IsReadOnlyDrive(location->drive) || location->isReadOnly) return FALSE;
  if (machine::IsHeldOpen(*location)) return FALSE;
  return DeleteLocated(*location, location->size);
}

BOOL CopyFileA(LPCSTR from, LPCSTR to, BOOL failIfExists) {
  if (CallFails("CopyFileA")) return FALSE;
  const auto fromLocation = Locate(PathOf(from));
  const auto toLocation = Locate(PathOf(to));
  if (!fromLocation || !toLocation || (failIfExists && toLocation->exists)) return FALSE;

  const int source = machine::OpenProgramFile(
      ObjectKind::kFile, PathOf(from),
      {.access = machine::kRead, .share = machine::kRead | machine::kWrite});
  if (source < 0) return FALSE;
  // A file copied onto itself is refused here: the target is opened for this copy alone.
  const int target = machine::OpenProgramFile(ObjectKind::kFile, PathOf(to),
                                              {.access = machine::kWrite, .create = true});
  const bool copied = target >= 0 && FillTarget(source, target, *fromLocation, *toLocation);
  if (target >= 0) machine::CloseOpenFile(target, ObjectKind::kFile);
  machine::CloseOpenFile(source, ObjectKind::kFile);
  return copied;
}

BOOL CreateDirectoryA(LPCSTR name, LPSECURITY_ATTRIBUTES) {
  if (CallFails("CreateDirectoryA")) return FALSE;
  const auto location = Locate(PathOf(name));
  if (!location || location->exists || !location->parentExists) return FALSE;
  if (location->dosLength >= kDirectoryPathLimit || IsReadOnlyDrive(location->drive)) return FALSE;
  std::error_code error;
  return fs::create_directory(location->host, error);
}

BOOL RemoveDirectoryA(LPCSTR name) {
  if (CallFails("RemoveDirectoryA")) return FALSE;
  const auto location = Locate(PathOf(name));
  if (!location || location->isRoot || !location->isDirectory) return FALSE;
  if (IsReadOnlyDrive(location->drive) || location->isReadOnly) return FALSE;
  // The host refuses a directory with anything in it.
  std::error_code error;
  return fs::remove(location->host, error);
}

DWORD GetFileAttributesA(LPCSTR name) {
  if (CallFails("GetFileAttributesA")) return INVALID_FILE_ATTRIBUTES;
  if (machine::IsDevicePath(PathOf(name))) return FILE_ATTRIBUTE_ARCHIVE;
  const auto location = Locate(PathOf(name));
  if (!location || !location->exists) return INVALID_FILE_ATTRIBUTES;
  if (location->isRoot) return FILE_ATTRIBUTE_DIRECTORY;
  const DWORD kind = location->isDirectory ? FILE_ATTRIBUTE_DIRECTORY : FILE_ATTRIBUTE_ARCHIVE;
  return location->isReadOnly ? kind | FILE_ATTRIBUTE_READONLY : kind;
}

}  // extern "C"

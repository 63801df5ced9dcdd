// The runtime's descriptor layer, over the drives of the machine. Its files let everyone else read
// and write them, but not delete them.
#include <string>

#include "machine/drives.h"
#include "machine/faults.h"
#include "machine/file_attributes.h"
#include "machine/open_files.h"
#include "platform/win32.h"

using machine::CallFails;
using machine::ObjectKind;
using machine::OpenFile;
using machine::OpenMode;
using machine::TransferFails;

namespace {

constexpr int kReadWrite = 0x0002;  // beside _O_RDONLY and _O_WRONLY
constexpr int kTextMode = 0x4000;   // the opposite of _O_BINARY, and the default
constexpr uint16_t kDirectoryBit = 0x4000;
constexpr uint16_t kFileBit = 0x8000;
constexpr DWORD kShareWithAll = machine::kRead | machine::kWrite;

OpenFile* FileOf(int descriptor) {
  return machine::FindOpenFile(descriptor, ObjectKind::kDescriptor);
}

int OpenDescriptor(const char* name, const OpenMode& mode, bool text) {
  if (name == nullptr) return -1;
  const int descriptor = machine::OpenProgramFile(ObjectKind::kDescriptor, name, mode);
  if (OpenFile* const file = FileOf(descriptor)) file->text = text;
  return descriptor;
}

// The new position has 32 bits; from 2 GiB on the answer is negative, but never -1.
int32_t Move(int descriptor, int32_t offset, int origin) {
  OpenFile* const file = FileOf(descriptor);
  if (file == nullptr || origin < 0) return -1;
  constexpr int64_t kLimit = UINT32_MAX - 1;
  const auto position = machine::MovePosition(*file, offset, static_cast<DWORD>(origin), kLimit);
  return position ? static_cast<int32_t>(*position) : -1;
}

std::string WithCarriageReturns(std::string_view text) {
  std::string result;
  result.reserve(text.size());
  for (const char c : text) {
    if (c == '\n') result += '\r';
    result += c;
  }
  return result;
}

}  // namespace

extern "C" {

// Opens existing files with sharing for all; of the runtime's other flags and share modes none is
// understood, and each makes the call fail.
int _sopen(const char* name, int flags, int share, ...) {
  if (CallFails("_sopen")) return -1;
  constexpr int kKnownFlags = _O_WRONLY | kReadWrite | kTextMode | _O_BINARY;
  if ((flags & ~kKnownFlags) != 0 || share != _SH_DENYNO) return -1;
  OpenMode mode{.share = kShareWithAll};
  switch (flags & (_O_WRONLY | kReadWrite)) {
    case _O_RDONLY:
      mode.access = machine::kRead;
      break;
    case _O_WRONLY:
      mode.access = machine::kWrite;
      break;
    case kReadWrite:
      mode.access = machine::kRead | machine::kWrite;
      break;
    default:
      return -1;
  }
  return OpenDescriptor(name, mode, (flags & _O_BINARY) == 0);
}

int _creat(const char* name, int permission) {
  if (CallFails("_creat")) return -1;
  const int left = permission & ~machine::PermissionMask();
  const OpenMode mode{.access = machine::kRead | machine::kWrite,
                      .share = kShareWithAll,
                      .create = true,
                      .readOnly = (left & _S_IWRITE) == 0};
  return OpenDescriptor(name, mode, true);
}

int _umask(int mask) {
  if (CallFails("_umask")) return -1;
  const int old = machine::PermissionMask();
  machine::PermissionMask() = mask & (_S_IREAD | _S_IWRITE);
  return old;
}

int _chmod(const char* name, int permission) {
  if (CallFails("_chmod") || name == nullptr) return -1;
  const auto location = machine::Locate(name);
  if (!location || !location->exists || location->isRoot) return -1;
  if (machine::IsReadOnlyDrive(location->drive)) return -1;
  const bool readOnly = (permission & _S_IWRITE) == 0;
  return machine::SetReadOnly(location->host, readOnly) ? 0 : -1;
}

int _setmode(int descriptor, int mode) {
  if (CallFails("_setmode")) return -1;
  OpenFile* const file = FileOf(descriptor);
  if (file == nullptr || (mode != _O_BINARY && mode != kTextMode)) return -1;
  const int old = file->text ? kTextMode : _O_BINARY;
  file->text = mode == kTextMode;
  return old;
}

// The runtime also reads CR LF as LF in text mode. Nobody reads text that way here, so it fails.
int _read(int descriptor, void* buffer, unsigned count) {
  if (TransferFails("_read", &count)) return -1;
  OpenFile* const file = FileOf(descriptor);
  if (file == nullptr || file->text || count > INT32_MAX) return -1;
  if (buffer == nullptr && count != 0) return -1;
  const auto got = machine::ReadBytes(*file, buffer, count);
  return got ? static_cast<int>(*got) : -1;
}

// Answers the caller's bytes; the CRs that text mode adds are not counted.
int _write(int descriptor, const void* buffer, unsigned count) {
  if (TransferFails("_write", &count)) return -1;
  OpenFile* const file = FileOf(descriptor);
  if (file == nullptr || count > INT32_MAX || (buffer == nullptr && count != 0)) return -1;
  bool written;
  if (file->text) {
    const std::string bytes = WithCarriageReturns({static_cast<const char*>(buffer), count});
    written = machine::WriteBytes(*file, bytes.data(), bytes.size());
  } else {
    written = machine::WriteBytes(*file, buffer, count);
  }
  return written ? static_cast<int>(count) : -1;
}

int32_t _lseek(int descriptor, int32_t offset, int origin) {
  return CallFails("_lseek") ? -1 : Move(descriptor, offset, origin);
}

int32_t _tell(int descriptor) {
  return CallFails("_tell") ? -1 : Move(descriptor, 0, FILE_CURRENT);
}

// A fault makes the answer a failure; the file is closed all the same.
int _close(int descriptor) {
  const bool fails = CallFails("_close");
  const bool closed = machine::CloseOpenFile(descriptor, ObjectKind::kDescriptor);
  return closed && !fails ? 0 : -1;
}

// A size above 31 bits makes the call fail, as in the runtime, and so does a separator at the end.
int _stat(const char* name, struct _stat* status) {
  if (CallFails("_stat") || name == nullptr || status == nullptr) return -1;
  const auto location = machine::Locate(name);
  if (!location || !location->exists) return -1;
  if (location->endsInSeparator && !location->isRoot) return -1;
  if (location->isDirectory) {
    *status = {.st_mode = kDirectoryBit | _S_IREAD | _S_IWRITE, .st_size = 0};
    return 0;
  }
  if (location->size > INT32_MAX) return -1;
  const int permission = location->isReadOnly ? _S_IREAD : _S_IREAD | _S_IWRITE;
  *status = {.st_mode = static_cast<uint16_t>(kFileBit | permission),
             .st_size = static_cast<int32_t>(location->size)};
  return 0;
}

}  // extern "C"

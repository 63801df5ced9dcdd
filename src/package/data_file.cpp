#include "package/data_file.h"

#include <cstring>
#include <new>

#include "platform/text.h"

namespace {

constexpr int kOwnerMayReadAndWrite = 0x180;  // _S_IREAD | _S_IWRITE

}  // namespace

DataFile::DataFile(const char* name) {
  if (IsMissingOrEmpty(name)) return;
  const size_t size = strlen(name) + 1;
  name_ = new (std::nothrow) char[size];
  if (name_ != nullptr) memcpy(name_, name, size);
}

DataFile::~DataFile() {
  (void)Close();  // nobody is left to tell
  delete[] name_;
}

int DataFile::OpenForRead() {
  return Open(GENERIC_READ, OPEN_EXISTING);
}
int DataFile::OpenForWrite() {
  return Open(GENERIC_WRITE, OPEN_EXISTING);
}

int DataFile::Create() {
  return Open(GENERIC_READ | GENERIC_WRITE, CREATE_ALWAYS);
}

int DataFile::Open(DWORD access, DWORD disposition) {
  if (handle_ != INVALID_HANDLE_VALUE || descriptor_ != -1 || name_ == nullptr) return 0;
  handle_ = CreateFileA(name_, access, 0, nullptr, disposition, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (handle_ != INVALID_HANDLE_VALUE) return 1;
  return OpenDescriptor(access, disposition);
}

int DataFile::OpenDescriptor(DWORD access, DWORD disposition) {
  if (disposition == CREATE_ALWAYS) {
    // Under this mask creat makes a read-only file, which its own descriptor can still write, and
    // chmod makes it writable: so it ends the same whatever mask the process had. The mask stays:
    // nothing else makes files by it.
    _umask(kOwnerMayReadAndWrite);
    descriptor_ = _creat(name_, kOwnerMayReadAndWrite);
    if (descriptor_ == -1) return 0;
    _chmod(name_, kOwnerMayReadAndWrite);
    // creat opens in text mode, where each line feed would grow a carriage return.
    if (_setmode(descriptor_, _O_BINARY) != -1) return 1;
    (void)Delete();  // a file that would come out changed is none
    return 0;
  }
  const int direction = access == GENERIC_READ ? _O_RDONLY : _O_WRONLY;
  descriptor_ = _sopen(name_, direction | _O_BINARY, _SH_DENYNO);
  return descriptor_ != -1 ? 1 : 0;
}

uint32_t DataFile::Read(void* buffer, uint32_t count) {
  if (buffer == nullptr || count == 0) return 0;
  if (handle_ != INVALID_HANDLE_VALUE) {
    DWORD done = 0;
    return ReadFile(handle_, buffer, count, &done, nullptr) != FALSE ? done : 0;
  }
  if (descriptor_ == -1) return 0;
  const int done = _read(descriptor_, buffer, count);
  return done > 0 ? static_cast<uint32_t>(done) : 0;
}

uint32_t DataFile::Write(const void* buffer, uint32_t count) {
  if (buffer == nullptr || count == 0) return 0;
  if (handle_ != INVALID_HANDLE_VALUE) {
    DWORD done = 0;
    return WriteFile(handle_, buffer, count, &done, nullptr) != FALSE ? done : 0;
  }
  if (descriptor_ == -1) return 0;
  const int done = _write(descriptor_, buffer, count);
  return done > 0 ? static_cast<uint32_t>(done) : 0;
}

uint32_t DataFile::GetSize() {
  if (handle_ != INVALID_HANDLE_VALUE) {
    const DWORD size = GetFileSize(handle_, nullptr);
    return size != INVALID_FILE_SIZE ? size : 0;
  }
  if (descriptor_ != -1) {
    const auto size = _lseek(descriptor_, 0, FILE_END);
    return size != -1 ? static_cast<uint32_t>(size) : 0;
  }
  struct _stat status = {};
  if (name_ == nullptr || _stat(name_, &status) < 0) return 0;
  return static_cast<uint32_t>(status.st_size);
}

int DataFile::SeekTo(int32_t position) {
  if (handle_ != INVALID_HANDLE_VALUE) {
    return SetFilePointer(handle_, position, nullptr, FILE_BEGIN) != INVALID_SET_FILE_POINTER;
  }
  return descriptor_ != -1 && _lseek(descriptor_, position, FILE_BEGIN) != -1;
}

int DataFile::SeekToEnd() {
  if (handle_ != INVALID_HANDLE_VALUE) {
    return SetFilePointer(handle_, 0, nullptr, FILE_END) != INVALID_SET_FILE_POINTER;
  }
  return descriptor_ != -1 && _lseek(descriptor_, 0, FILE_END) != -1;
}

int32_t DataFile::Tell() {
  if (handle_ != INVALID_HANDLE_VALUE) {
    return static_cast<int32_t>(SetFilePointer(handle_, 0, nullptr, FILE_CURRENT));
  }
  return descriptor_ != -1 ? static_cast<int32_t>(_tell(descriptor_)) : -1;
}

int DataFile::Close() {
  int result = 1;
  if (handle_ != INVALID_HANDLE_VALUE) {
    result = CloseHandle(handle_);
    handle_ = INVALID_HANDLE_VALUE;
  }
  if (descriptor_ != -1) {
    result = _close(descriptor_) == 0 ? 1 : 0;
    descriptor_ = -1;
  }
  return result;
}

int DataFile::Delete() {
  (void)Close();  // a file that could not be closed may still be deleted
  if (name_ == nullptr) return 0;
  return DeleteFileA(name_) != FALSE ? 1 : 0;
}

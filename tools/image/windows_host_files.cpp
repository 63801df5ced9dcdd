#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include <algorithm>
#include <cerrno>
#include <system_error>
#include <utility>

#include "tools/image/host_files.h"

namespace image {
namespace {

constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

// For the last call that failed.
void SetErrno() {
  const std::error_code error(static_cast<int>(GetLastError()), std::system_category());
  const std::error_condition condition = error.default_error_condition();
  errno = condition.category() == std::generic_category() ? condition.value() : EIO;
}

HANDLE HandleOf(int descriptor) {
  return reinterpret_cast<HANDLE>(_get_osfhandle(descriptor));
}

// Takes the handle over; -1 for none.
int DescriptorOf(HANDLE handle) {
  if (handle == INVALID_HANDLE_VALUE) {
    SetErrno();
    return -1;
  }
  const int descriptor = _open_osfhandle(reinterpret_cast<intptr_t>(handle), _O_BINARY);
  if (descriptor < 0) CloseHandle(handle);
  return descriptor;
}

std::function<void()> cleanUpAtEnd;

// Also called for a closed console window, a log-off and a shutdown. The next handler, the system's
// own, ends the process.
BOOL WINAPI CleanUp(DWORD) {
  cleanUpAtEnd();
  return FALSE;
}

}  // namespace

int OpenFile(const std::filesystem::path& path) {
  return DescriptorOf(CreateFileW(path.c_str(), GENERIC_READ, kShareAll, nullptr, OPEN_EXISTING,
                                  FILE_FLAG_BACKUP_SEMANTICS, nullptr));
}

void CloseFile(int descriptor) {
  _close(descriptor);
}

std::optional<uint64_t> SizeOfPlainFile(int descriptor) {
  const HANDLE handle = HandleOf(descriptor);
  BY_HANDLE_FILE_INFORMATION file = {};
  const bool isPlain = GetFileType(handle) == FILE_TYPE_DISK &&
                       GetFileInformationByHandle(handle, &file) != FALSE &&
                       (file.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
  if (!isPlain) return std::nullopt;
  return uint64_t{file.nFileSizeHigh} << 32 | file.nFileSizeLow;
}

int64_t ReadAt(int descriptor, uint64_t offset, std::span<uint8_t> bytes) {
  constexpr size_t kMostAtOnce = 1u << 30;
  OVERLAPPED place = {};
  place.Offset = static_cast<DWORD>(offset);
  place.OffsetHigh = static_cast<DWORD>(offset >> 32);
  DWORD count = 0;
  const auto wanted = static_cast<DWORD>(std::min(bytes.size(), kMostAtOnce));
  if (ReadFile(HandleOf(descriptor), bytes.data(), wanted, &count, &place) != FALSE) return count;
  if (GetLastError() == ERROR_HANDLE_EOF) return 0;
  SetErrno();
  return -1;
}

std::FILE* CreateNewFile(const std::filesystem::path& path, FileKind) {
  const int descriptor = DescriptorOf(CreateFileW(path.c_str(), GENERIC_WRITE, kShareAll, nullptr,
                                                  CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr));
  if (descriptor < 0) return nullptr;
  std::FILE* const file = _fdopen(descriptor, "wb");
  if (file == nullptr) {
    const int reason = errno;
    _close(descriptor);
    DeleteFileW(path.c_str());
    errno = reason;
  }
  return file;
}

void CleanUpWhenStopped(const std::function<void()>& cleanUp) {
  cleanUpAtEnd = cleanUp;
  SetConsoleCtrlHandler(CleanUp, TRUE);
}

bool HasTerminal() {
  DWORD mode = 0;
  return GetConsoleMode(GetStdHandle(STD_ERROR_HANDLE), &mode) != FALSE;
}

}  // namespace image

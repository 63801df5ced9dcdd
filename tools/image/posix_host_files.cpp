#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <thread>

#include "tools/image/host_files.h"

namespace image {
namespace {

[[noreturn]] void DieOf(int signal) {
  sigset_t only;
  sigemptyset(&only);
  sigaddset(&only, signal);
  std::signal(signal, SIG_DFL);
  raise(signal);
  pthread_sigmask(SIG_UNBLOCK, &only, nullptr);
  std::abort();  // not reached
}

}  // namespace

int OpenFile(const std::filesystem::path& path) {
  // Without O_NONBLOCK the open of a pipe that nobody writes to would wait for ever.
  return open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
}

void CloseFile(int descriptor) {
  close(descriptor);
}

std::optional<uint64_t> SizeOfPlainFile(int descriptor) {
  struct stat status {};
  if (fstat(descriptor, &status) != 0 || !S_ISREG(status.st_mode)) return std::nullopt;
  return static_cast<uint64_t>(status.st_size);
}

int64_t ReadAt(int descriptor, uint64_t offset, std::span<uint8_t> bytes) {
  for (;;) {
    const ssize_t count = pread(descriptor, bytes.data(), bytes.size(), static_cast<off_t>(offset));
    if (count >= 0 || errno != EINTR) return count;
  }
}

std::FILE* CreateNewFile(const std::filesystem::path& path, FileKind kind) {
  const mode_t mode = kind == FileKind::kProgram ? 0777 : 0666;
  const int descriptor = open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode);
  if (descriptor < 0) return nullptr;
  std::FILE* const file = fdopen(descriptor, "wb");
  if (file == nullptr) {
    const int reason = errno;
    close(descriptor);
    unlink(path.c_str());
    errno = reason;
  }
  return file;
}

// A thread that waits for the signal may do what a signal handler must not. The SIGPIPE of a write
// of the process's own does not come here: the write fails, and says so.
void CleanUpWhenStopped(const std::function<void()>& cleanUp) {
  sigset_t signals;
  sigemptyset(&signals);
  for (const int signal : {SIGINT, SIGTERM, SIGHUP, SIGQUIT, SIGPIPE}) {
    struct sigaction present {};
    if (sigaction(signal, nullptr, &present) == 0 && present.sa_handler != SIG_IGN)
      sigaddset(&signals, signal);
  }
  pthread_sigmask(SIG_BLOCK, &signals, nullptr);
  std::thread([signals, cleanUp] {
    int signal = 0;
    if (sigwait(&signals, &signal) != 0) return;
    cleanUp();
    DieOf(signal);
  }).detach();
}

bool HasTerminal() {
  return isatty(STDERR_FILENO) != 0;
}

}  // namespace image

// A process of its own makes the folder, waits until the last descriptor of a socket is closed that
// all the others hold, whatever has ended them, and takes the folder away.
#include "tools/planner/throwaway_folder.h"

#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <stdexcept>
#include <string>

#include "tools/image/bad_input.h"

namespace fs = std::filesystem;

namespace image {
namespace {

// Folders in it may be closed to writing.
void RemoveFolder(const fs::path& folder) {
  std::error_code failure;
  for (fs::recursive_directory_iterator entry(folder, failure), end; !failure && entry != end;
       entry.increment(failure)) {
    if (entry->is_directory(failure) && !entry->is_symlink(failure))
      fs::permissions(entry->path(), fs::perms::owner_all, fs::perm_options::add, failure);
  }
  fs::remove_all(folder, failure);
}

[[noreturn]] void Keep(std::string name, int end) {
  if (mkdtemp(name.data()) == nullptr) _exit(EXIT_FAILURE);
  const bool isTold = write(end, name.data(), name.size()) == static_cast<ssize_t>(name.size());
  char byte = 0;
  while (isTold && (read(end, &byte, 1) > 0 || errno == EINTR)) errno = 0;
  RemoveFolder(name);
  _exit(EXIT_SUCCESS);
}

}  // namespace

ThrowawayFolder::ThrowawayFolder() {
  const std::string pattern = (fs::temp_directory_path() / "moriv-plan-XXXXXX").string();
  std::array<int, 2> ends = {};
  if (socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends.data()) != 0)
    throw std::runtime_error("no socket: " + SystemReason(LastCallError()));

  // No signal to the group of processes ends the keeper.
  sigset_t all, before;
  sigfillset(&all);
  pthread_sigmask(SIG_BLOCK, &all, &before);
  keeper_ = fork();
  if (keeper_ == 0) {
    close(ends[0]);
    Keep(pattern, ends[1]);
  }
  pthread_sigmask(SIG_SETMASK, &before, nullptr);
  close(ends[1]);
  end_ = ends[0];

  std::string name(pattern.size(), '\0');
  if (keeper_ < 0 || read(end_, name.data(), name.size()) != static_cast<ssize_t>(name.size())) {
    if (keeper_ > 0) waitpid(keeper_, nullptr, 0);
    close(end_);
    throw std::runtime_error(pattern + ": can't be made");
  }
  path_ = fs::canonical(name);
}

ThrowawayFolder::~ThrowawayFolder() {
  close(end_);
  while (waitpid(keeper_, nullptr, 0) < 0 && errno == EINTR) {
  }
}

}  // namespace image

#include "tools/image/temporary_files.h"

#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <mutex>
#include <set>
#include <thread>

namespace image {
namespace {

struct Registry {
  std::mutex mutex;
  std::set<std::string> names;
};

// Never destroyed: the thread that waits for a signal may still be there at the end of the process.
Registry& TheRegistry() {
  static Registry& registry = *new Registry;
  return registry;
}

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

int MakeTemporaryFile(std::string* name) {
  Registry& registry = TheRegistry();
  const std::lock_guard lock(registry.mutex);
  const int descriptor = mkstemp(name->data());
  if (descriptor >= 0) registry.names.insert(*name);
  return descriptor;
}

void ForgetTemporaryFile(const std::string& name) {
  Registry& registry = TheRegistry();
  const std::lock_guard lock(registry.mutex);
  registry.names.erase(name);
}

// A thread that waits for the signal may do what a signal handler must not.
void DeleteTemporaryFilesOnSignal() {
  sigset_t signals;
  sigemptyset(&signals);
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    struct sigaction present {};
    if (sigaction(signal, nullptr, &present) == 0 && present.sa_handler != SIG_IGN)
      sigaddset(&signals, signal);
  }
  pthread_sigmask(SIG_BLOCK, &signals, nullptr);
  std::thread([signals] {
    int signal = 0;
    if (sigwait(&signals, &signal) != 0) return;
    Registry& registry = TheRegistry();
    const std::lock_guard lock(registry.mutex);  // kept to the end: no new file after this
    for (const std::string& name : registry.names) unlink(name.c_str());
    DieOf(signal);
  }).detach();
}

}  // namespace image

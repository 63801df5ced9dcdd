#include "tools/image/temporary_files.h"

#include <cerrno>
#include <mutex>
#include <random>
#include <set>
#include <string>

namespace image {
namespace {

struct Registry {
  std::mutex mutex;
  std::set<std::filesystem::path> paths;
};

// Never destroyed: the thread that cleans up may still be there at the end of the process.
Registry& TheRegistry() {
  static Registry& registry = *new Registry;
  return registry;
}

std::string RandomName() {
  constexpr char kLetters[] = "abcdefghijklmnopqrstuvwxyz0123456789";
  std::random_device random;
  std::uniform_int_distribution<size_t> choice(0, sizeof kLetters - 2);
  std::string name = ".moriv-";
  for (int i = 0; i < 6; ++i) name += kLetters[choice(random)];
  return name;
}

}  // namespace

std::FILE* MakeTemporaryFile(const std::filesystem::path& folder, FileKind kind,
                             std::filesystem::path* path) {
  Registry& registry = TheRegistry();
  const std::lock_guard lock(registry.mutex);
  std::FILE* file = nullptr;
  do {
    *path = folder / RandomName();
    file = CreateNewFile(*path, kind);
  } while (file == nullptr && errno == EEXIST);
  if (file != nullptr) registry.paths.insert(*path);
  return file;
}

void ForgetTemporaryFile(const std::filesystem::path& path) {
  Registry& registry = TheRegistry();
  const std::lock_guard lock(registry.mutex);
  registry.paths.erase(path);
}

void DeleteTemporaryFilesWhenStopped() {
  CleanUpWhenStopped([] {
    Registry& registry = TheRegistry();
    registry.mutex.lock();  // for good: no new file after this
    std::error_code ignored;
    for (const std::filesystem::path& path : registry.paths) std::filesystem::remove(path, ignored);
  });
}

}  // namespace image

// A thousand files installed into one folder would be a thousand readings of it, each longer than
// the one before: so a large folder is read once and watched. A small one is not, since the host
// takes milliseconds to end a watch.
#include "machine/folder_names.h"

#include <dirent.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <map>
#include <memory>
#include <set>

#include "machine/code_page.h"

namespace fs = std::filesystem;

namespace machine {
namespace {

constexpr uint32_t kCame = IN_CREATE | IN_MOVED_TO;
constexpr uint32_t kWent = IN_DELETE | IN_MOVED_FROM;

constexpr size_t kLargeFolder = 150;  // names

// Host spellings below the name in upper case, in the code page.
using Names = std::map<std::string, std::set<std::string>, std::less<>>;

int notifier = -1;             // the host's; -1 before the first folder is read
std::map<int, Names> watched;  // by the notifier's number of the folder

std::string UpperCase(std::string name) {
  for (char& c : name) c = static_cast<char>(ToUpperByte(static_cast<unsigned char>(c)));
  return name;
}

void Add(Names& names, const char* spelling) {
  names[UpperCase(FromUtf8(spelling))].insert(spelling);
}

void Remove(Names& names, const char* spelling) {
  const auto entry = names.find(UpperCase(FromUtf8(spelling)));
  if (entry == names.end()) return;
  entry->second.erase(spelling);
  if (entry->second.empty()) names.erase(entry);
}

struct FolderClose {
  void operator()(DIR* folder) const { closedir(folder); }
};

template <typename Visit>
void ForEachName(const fs::path& folder, Visit visit) {
  const std::unique_ptr<DIR, FolderClose> open(opendir(folder.c_str()));
  while (const dirent* const entry = open ? readdir(open.get()) : nullptr) visit(entry->d_name);
}

Names ReadNames(const fs::path& folder) {
  Names names;
  ForEachName(folder, [&names](const char* spelling) { Add(names, spelling); });
  return names;
}

// As FindSpelling, by reading the folder; counts its names.
std::string Search(const fs::path& folder, std::string_view name, size_t* count) {
  std::string found;
  ForEachName(folder, [&](const char* spelling) {
    ++*count;
    if (!EqualNoCase(FromUtf8(spelling), name)) return;
    if (found.empty() || spelling < found) found = spelling;
  });
  return found;
}

void TakeChange(const inotify_event& change) {
  if ((change.mask & IN_Q_OVERFLOW) != 0) return ForgetFolders();
  const auto folder = watched.find(change.wd);
  if (folder == watched.end()) return;
  if ((change.mask & IN_IGNORED) != 0) {  // the folder is gone
    watched.erase(folder);
  } else if ((change.mask & kCame) != 0) {
    Add(folder->second, change.name);
  } else if ((change.mask & kWent) != 0) {
    Remove(folder->second, change.name);
  }
}

// The host queues a change before the call that makes it returns.
void TakeChanges() {
  alignas(inotify_event) char changes[4096];
  ssize_t size = 0;
  while (notifier >= 0 && (size = read(notifier, changes, sizeof(changes))) > 0) {
    for (ssize_t at = 0; at < size;) {
      const auto* const change = reinterpret_cast<const inotify_event*>(changes + at);
      at += static_cast<ssize_t>(sizeof(inotify_event) + change->len);
      TakeChange(*change);
    }
  }
}

std::string FirstSpelling(const Names& names, const std::string& upperCase) {
  const auto entry = names.find(upperCase);
  return entry == names.end() ? "" : *entry->second.begin();
}

}  // namespace

std::string FindSpelling(const fs::path& folder, std::string_view name) {
  if (watched.empty()) {
    size_t count = 0;
    std::string spelling = Search(folder, name, &count);
    if (count < kLargeFolder) return spelling;
  }
  const std::string upperCase = UpperCase(std::string(name));
  TakeChanges();
  if (notifier < 0) notifier = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
  // The number is that of the folder itself: whatever its path, and the same each time.
  const int watch = inotify_add_watch(notifier, folder.c_str(), kCame | kWent | IN_ONLYDIR);
  if (watch < 0) return FirstSpelling(ReadNames(folder), upperCase);
  // Watched before it is read: a change in between is told as well, which does no harm.
  auto known = watched.find(watch);
  if (known == watched.end()) known = watched.emplace(watch, ReadNames(folder)).first;
  return FirstSpelling(known->second, upperCase);
}

void ForgetFolders() {
  if (notifier >= 0) close(notifier);
  notifier = -1;
  watched.clear();
}

}  // namespace machine

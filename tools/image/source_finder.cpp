#include "tools/image/source_finder.h"

#include <algorithm>

#include "tools/image/bad_input.h"
#include "tools/image/host_text.h"
#include "tools/image/package_description.h"

namespace image {
namespace {

namespace fs = std::filesystem;

// Offset of the character behind the one at `at`.
size_t NextCharacter(std::string_view utf8, size_t at) {
  do {
    ++at;
  } while (at < utf8.size() && (static_cast<unsigned char>(utf8[at]) & 0xC0) == 0x80);
  return at;
}

// When a character doesn't fit, the last * takes one more.
bool Matches(std::string_view name, std::string_view pattern) {
  size_t at = 0;
  size_t in = 0;
  size_t star = std::string_view::npos;
  size_t taken = 0;  // by that *, up to this offset
  while (at < name.size()) {
    if (in < pattern.size() && pattern[in] == '*') {
      star = in++;
      taken = at;
    } else if (in < pattern.size() && pattern[in] == '?') {
      at = NextCharacter(name, at);
      ++in;
    } else if (in < pattern.size() && pattern[in] == name[at]) {
      ++at;
      ++in;
    } else if (star != std::string_view::npos) {
      taken = at = NextCharacter(name, taken);
      in = star + 1;
    } else {
      return false;
    }
  }
  return pattern.find_first_not_of('*', in) == std::string_view::npos;
}

std::string PathIn(const std::string& folder, const std::string& name) {
  return folder.empty() || folder.ends_with('/') ? folder + name : folder + '/' + name;
}

class SourceFinder {
 public:
  explicit SourceFinder(const fs::path& sourceFolder) : sourceFolder_(sourceFolder) {}

  std::vector<std::string> Match(const std::string& pattern) {
    const size_t wildcard = pattern.find_first_of("*?");
    const size_t slash = pattern.rfind('/', wildcard);
    const size_t begin = slash == std::string::npos ? 0 : slash + 1;
    SetStart(pattern.substr(0, begin));
    Descend(pattern.substr(0, begin), pattern.substr(begin));
    return Sorted();
  }

  std::vector<std::string> Tree(const std::string& tree) {
    SetStart(tree);
    TakeAllBelow(tree);
    return Sorted();
  }

 private:
  void SetStart(const std::string& folder) {
    std::error_code error;
    start_ = fs::canonical(OnHost(folder), error);
    if (error) throw BadInput(OnHost(folder), "can't be read: " + SystemReason(error));
  }

  fs::path OnHost(const std::string& folder) const {
    const fs::path path = sourceFolder_ / PathOf(folder);
    return path.empty() ? fs::path(".") : path;
  }

  std::vector<fs::directory_entry> EntriesOf(const std::string& folder) const {
    const fs::path path = OnHost(folder);
    std::vector<fs::directory_entry> entries;
    std::error_code error;
    for (fs::directory_iterator next(path, error), end; !error && next != end;
         next.increment(error)) {
      entries.push_back(*next);
    }
    if (error) throw BadInput(path, "can't be read: " + SystemReason(error));
    return entries;
  }

  void Descend(const std::string& folder, const std::string& pattern) {
    const size_t end = std::min(pattern.find('/'), pattern.size());
    const std::string part = pattern.substr(0, end);
    const bool isLast = end == pattern.size();
    for (const fs::directory_entry& entry : EntriesOf(folder)) {
      const std::string name = TextOf(entry.path().filename());
      if (!Matches(name, part)) continue;
      const bool isFolder = IsFolder(entry);
      if (isLast && !isFolder) Take(PathIn(folder, name));
      if (!isLast && isFolder) Descend(PathIn(folder, name), pattern.substr(end + 1));
    }
  }

  void TakeAllBelow(const std::string& folder) {
    for (const fs::directory_entry& entry : EntriesOf(folder)) {
      const std::string path = PathIn(folder, TextOf(entry.path().filename()));
      if (IsFolder(entry)) {
        TakeAllBelow(path);
      } else {
        Take(path);
      }
    }
  }

  // Throws for a link that is not taken.
  bool IsFolder(const fs::directory_entry& entry) const {
    std::error_code error;
    if (!entry.is_symlink(error)) return entry.is_directory(error);
    const fs::path target = fs::canonical(entry.path(), error);
    const bool isBelow =
        !error && std::mismatch(start_.begin(), start_.end(), target.begin(), target.end()).first ==
                      start_.end();
    if (!isBelow || !fs::is_regular_file(target, error)) {
      throw BadInput(entry.path(), "is a link to a folder, to nothing, or out of " +
                                       TextOf(start_) + "; put there what it leads to");
    }
    return false;
  }

  void Take(const std::string& source) {
    if (found_.size() == kMostFiles) {
      throw BadInput(start_, "has more than 65535 files; leave some out");
    }
    found_.push_back(source);
  }

  std::vector<std::string> Sorted() {
    std::ranges::sort(found_);
    return std::move(found_);
  }

  const fs::path sourceFolder_;
  fs::path start_;  // where the search began, without links
  std::vector<std::string> found_;
};

}  // namespace

bool IsPattern(std::string_view source) {
  return source.find_first_of("*?") != std::string_view::npos;
}

std::vector<std::string> FindMatches(const fs::path& sourceFolder, const std::string& pattern) {
  return SourceFinder(sourceFolder).Match(pattern);
}

std::vector<std::string> FindTree(const fs::path& sourceFolder, const std::string& tree) {
  return SourceFinder(sourceFolder).Tree(tree);
}

}  // namespace image

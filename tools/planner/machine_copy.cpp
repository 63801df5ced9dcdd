#include "tools/planner/machine_copy.h"

#include <sys/stat.h>

#include <cerrno>

#include "tools/image/bad_input.h"

namespace fs = std::filesystem;

namespace image {
namespace {

class MachineCopier {
 public:
  MachineCopier(fs::path machine, fs::path copy)
      : machine_(std::move(machine)), copy_(std::move(copy)) {}

  void CopyFolder(const fs::path& from, const fs::path& to) const {
    fs::create_directory(to);
    for (const fs::directory_entry& entry : fs::directory_iterator(from)) {
      // The folder for temporary files may lie in the machine's.
      if (entry.path() != copy_.parent_path()) CopyEntry(entry, to / entry.path().filename());
    }
    fs::permissions(to, fs::status(from).permissions());
  }

 private:
  void CopyEntry(const fs::directory_entry& entry, const fs::path& to) const {
    switch (entry.symlink_status().type()) {
      case fs::file_type::symlink:
        return CopyLink(entry.path(), to);
      case fs::file_type::directory:
        return CopyFolder(entry.path(), to);
      case fs::file_type::regular:
        fs::copy_file(entry.path(), to);
        return;
      default:
        if (mkfifo(to.c_str(), S_IRUSR) != 0) throw BadInput(to, SystemReason(LastCallError()));
    }
  }

  void CopyLink(const fs::path& link, const fs::path& to) const {
    std::error_code failure;
    const fs::path target = fs::canonical(link, failure);
    fs::create_symlink(failure ? fs::read_symlink(link) : PathInCopy(target, machine_, copy_), to);
  }

  fs::path machine_;  // canonical
  fs::path copy_;
};

}  // namespace

void CopyMachine(const fs::path& machine, const fs::path& copy) {
  const fs::path source = fs::canonical(machine);
  MachineCopier(source, copy).CopyFolder(source, copy);
}

fs::path PathInCopy(const fs::path& file, const fs::path& machine, const fs::path& copy) {
  const fs::path relative = fs::canonical(file).lexically_relative(fs::canonical(machine));
  return relative.empty() || *relative.begin() == ".." ? file : copy / relative;
}

}  // namespace image

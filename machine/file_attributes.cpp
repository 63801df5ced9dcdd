#include "machine/file_attributes.h"

#include "machine/code_page.h"

namespace fs = std::filesystem;

namespace machine {

bool SetReadOnly(const fs::path& file, bool readOnly) {
  constexpr fs::perms kAllWrite =
      fs::perms::owner_write | fs::perms::group_write | fs::perms::others_write;
  std::error_code error;
  if (fs::is_regular_file(file, error) && fs::hard_link_count(file, error) > 1) return false;
  if (readOnly) {
    fs::permissions(file, kAllWrite, fs::perm_options::remove, error);
  } else {
    fs::permissions(file, fs::perms::owner_write, fs::perm_options::add, error);
  }
  return !error;
}

void MarkProgram(const fs::path& file) {
  if (!EqualNoCase(file.extension().string(), ".exe")) return;
  // Whoever may read it may run it.
  std::error_code error;
  const fs::perms readers =
      fs::status(file, error).permissions() &
      (fs::perms::owner_read | fs::perms::group_read | fs::perms::others_read);
  const auto executors = static_cast<fs::perms>(static_cast<unsigned>(readers) >> 2);
  fs::permissions(file, executors, fs::perm_options::add, error);
}

}  // namespace machine

#include "machine/host_file.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <fstream>

namespace fs = std::filesystem;

namespace machine {
namespace {

constexpr int kMostNewNames = 100;

// A descriptor on a file that this call made, and its name in `made`; -1 for none.
int MakeFileBeside(const fs::path& file, fs::path* made) {
  int descriptor = -1;
  for (int number = 0; descriptor < 0 && number < kMostNewNames; ++number) {
    *made = file;
    *made += number == 0 ? ".new" : ".new" + std::to_string(number);
    descriptor = open(made->c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0666);
    if (descriptor < 0 && errno != EEXIST) break;
  }
  return descriptor;
}

}  // namespace

std::optional<std::vector<uint8_t>> ReadHostFile(const fs::path& file) {
  std::error_code code;
  if (!fs::is_regular_file(file, code)) return std::nullopt;
  std::ifstream stream(file, std::ios::binary);
  std::vector<uint8_t> bytes;
  char part[1 << 16];
  while (stream.read(part, sizeof(part)), stream.gcount() > 0) {
    bytes.insert(bytes.end(), part, part + stream.gcount());
  }
  if (!stream.eof()) return std::nullopt;
  return bytes;
}

bool ReadOwnFile(const fs::path& file, std::optional<std::string>* text, std::string* error) {
  text->reset();
  std::error_code code;
  const fs::file_type type = fs::symlink_status(file, code).type();
  if (type == fs::file_type::not_found) return true;
  const auto bytes = type == fs::file_type::regular ? ReadHostFile(file) : std::nullopt;
  if (bytes) {
    text->emplace(bytes->begin(), bytes->end());
  } else {
    *error = file.filename().string() + ": is no plain file that can be read";
  }
  return bytes.has_value();
}

bool WriteAt(int descriptor, std::string_view bytes, off_t position) {
  while (!bytes.empty()) {
    const ssize_t written = pwrite(descriptor, bytes.data(), bytes.size(), position);
    if (written <= 0) return false;
    bytes.remove_prefix(static_cast<size_t>(written));
    position += written;
  }
  return true;
}

bool ReplaceHostFile(const fs::path& file, std::string_view bytes) {
  fs::path made;
  const int descriptor = MakeFileBeside(file, &made);
  if (descriptor < 0) return false;
  const bool written = WriteAt(descriptor, bytes, 0);
  const bool closed = close(descriptor) == 0;
  std::error_code code;
  if (written && closed) fs::rename(made, file, code);
  if (written && closed && !code) return true;
  unlink(made.c_str());
  return false;
}

}  // namespace machine

#include "machine/host_file.h"

#include <fstream>

namespace machine {

std::optional<std::vector<uint8_t>> ReadHostFile(const std::filesystem::path& file) {
  std::error_code code;
  if (!std::filesystem::is_regular_file(file, code)) return std::nullopt;
  std::ifstream stream(file, std::ios::binary);
  std::vector<uint8_t> bytes;
  char part[1 << 16];
  while (stream.read(part, sizeof(part)), stream.gcount() > 0) {
    bytes.insert(bytes.end(), part, part + stream.gcount());
  }
  if (!stream.eof()) return std::nullopt;
  return bytes;
}

}  // namespace machine

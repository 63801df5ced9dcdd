#include "tools/image/executable_part.h"

#include <algorithm>
#include <span>
#include <vector>

#include "tools/image/bad_input.h"
#include "tools/image/version_data.h"

namespace image {

void RequireVersion(const std::filesystem::path& program) {
  if (ReadVersionData(program).IsComplete()) return;
  throw BadInput(program,
                 "has no version resource with a translation and a file version, which the setup "
                 "program needs of itself; use a setup program as it was built");
}

void RequireOtherFile(const std::filesystem::path& input, const std::filesystem::path& output) {
  std::error_code error;
  if (std::filesystem::equivalent(input, output, error)) {
    throw BadInput(output, "is the input itself; name another output");
  }
}

void CopyExecutable(const InputFile& file, uint64_t size, OutputFile* output) {
  std::vector<uint8_t> block(65536);
  for (uint64_t offset = 0; offset < size;) {
    const auto count = static_cast<size_t>(std::min<uint64_t>(block.size(), size - offset));
    const std::span<uint8_t> part(block.data(), count);
    file.Read(offset, part);
    output->Write(part);
    offset += count;
  }
}

}  // namespace image

#include "tools/image/executable_part.h"

#include <algorithm>
#include <span>
#include <string>
#include <vector>

#include "machine/bounded_bytes.h"
#include "machine/executable_resources.h"
#include "machine/mapped_file.h"
#include "tools/image/bad_input.h"
#include "tools/image/image_contents.h"
#include "tools/image/stream_format.h"
#include "tools/image/version_data.h"

namespace image {
namespace {

constexpr int kDialogType = 5;
constexpr int kDialog = 116;
constexpr int kStringType = 6;
constexpr int kLogNameText = 137;
constexpr std::u16string_view kLogName = u"MorivLog.txt";

// Texts stand in blocks of 16, each text with its length in front.
std::u16string TextOfBlock(std::span<const uint8_t> bytes, int index) {
  machine::BoundedBytes block(bytes);
  uint64_t offset = 0;
  for (; index > 0; --index) offset += 2 + 2 * uint64_t{block.U16(offset)};
  std::u16string text(block.U16(offset), u'\0');
  for (char16_t& unit : text) unit = block.U16(offset += 2);
  return block.good() ? text : u"";
}

bool HasLogName(std::span<const uint8_t> program) {
  const auto block = machine::FindProgramResource(program, kStringType, kLogNameText / 16 + 1);
  return block && TextOfBlock(*block, kLogNameText % 16) == kLogName;
}

}  // namespace

void RequireSetupProgram(const std::filesystem::path& stub) {
  const InputFile file(stub);
  const std::string mend = "; use the setup program as it was built";
  if (FindHeader(file)) throw BadInput(stub, "has a package behind it already" + mend);
  if (file.Size() > kLargestSize) throw BadInput(stub, "has 2 GiB or more; use a smaller file");
  const machine::MappedFile mapped(stub);
  const std::span<const uint8_t> program = mapped.bytes();
  if (const auto extent = machine::FindProgramExtent(program)) {
    if (extent->isSigned) {
      throw BadInput(stub, "has a signature, which would not hold for the image" + mend);
    }
    if (program.size() > extent->end) {
      throw BadInput(stub, "has " + std::to_string(program.size() - extent->end) +
                               " bytes behind its last section" + mend);
    }
  }
  RequireVersion(stub);
  if (!machine::FindProgramResource(program, kDialogType, kDialog) || !HasLogName(program)) {
    throw BadInput(stub,
                   "is another program: its resources lack the setup program's dialog or the name "
                   "of its log; name MorivSetup.exe or MorivSetup as it was built");
  }
}

void RequireVersion(const std::filesystem::path& program) {
  if (ReadVersionData(program).IsComplete()) return;
  throw BadInput(program,
                 "has no version resource with a translation and a file version, which the setup "
                 "program needs of itself; use a setup program as it was built");
}

bool IsSameFile(const std::filesystem::path& a, const std::filesystem::path& b) {
  std::error_code error;
  if (std::filesystem::equivalent(a, b, error)) return true;
  const auto first = std::filesystem::weakly_canonical(a, error);
  return !error && first == std::filesystem::weakly_canonical(b, error) && !error;
}

void RequireOtherFile(const std::filesystem::path& input, const std::filesystem::path& output) {
  if (IsSameFile(input, output)) throw BadInput(output, "is the input itself; name another output");
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

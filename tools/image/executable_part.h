// The setup program itself, as the part of an image that stands in front of the records.
#pragma once

#include <cstdint>
#include <filesystem>

#include "tools/image/input_file.h"
#include "tools/image/output_file.h"

namespace image {

// Throws BadInput unless the program carries a version resource with a translation and a file
// version: without it no install from its image can write a removal program.
void RequireVersion(const std::filesystem::path& program);

// Throws BadInput when the output would take the place of the input.
void RequireOtherFile(const std::filesystem::path& input, const std::filesystem::path& output);

// Copies the first `size` bytes of a file.
void CopyExecutable(const InputFile& file, uint64_t size, OutputFile* output);

}  // namespace image

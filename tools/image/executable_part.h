// The setup program itself, as the part of an image that stands in front of the records.
#pragma once

#include <cstdint>
#include <filesystem>

#include "tools/image/input_file.h"
#include "tools/image/output_file.h"

namespace image {

// Throws BadInput, with the reason, for a file that is not this setup program as it was built: one
// with a package already, one whose own resources are others, and one that more than its sections
// would go into the image of: a signature, or any bytes behind the last of them.
void RequireSetupProgram(const std::filesystem::path& stub);

// Throws BadInput unless the program carries a version resource with a translation and a file
// version: without it no install from its image can write a removal program.
void RequireVersion(const std::filesystem::path& program);

// Whether both name one file, there or not yet, by whatever path or link.
bool IsSameFile(const std::filesystem::path& a, const std::filesystem::path& b);

// Throws BadInput when the output would take the place of the input.
void RequireOtherFile(const std::filesystem::path& input, const std::filesystem::path& output);

// Copies the first `size` bytes of a file.
void CopyExecutable(const InputFile& file, uint64_t size, OutputFile* output);

}  // namespace image

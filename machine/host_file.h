// Files of the host.
#pragma once

#include <sys/types.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace machine {

// The bytes of a regular file; nullopt when it is none or can't be read.
std::optional<std::vector<uint8_t>> ReadHostFile(const std::filesystem::path& file);

// Reads a file of the machine's own folder, its settings or its registry. One that is absent leaves
// `text` without a value. False, with "NAME: what" in `error`, for what can't be read and for all
// but a plain file: a link could lead out of the folder, and a pipe would never end.
bool ReadOwnFile(const std::filesystem::path& file, std::optional<std::string>* text,
                 std::string* error);

// Makes or replaces a file as a whole: a new file is written beside it and renamed. No link is
// written through: a name that something has is not the new file's. False, with all as it was, when
// the host refuses.
bool ReplaceHostFile(const std::filesystem::path& file, std::string_view bytes);

// Writes all of the bytes to a host's descriptor. False when the host took only part of them.
bool WriteAt(int descriptor, std::string_view bytes, off_t position);

}  // namespace machine

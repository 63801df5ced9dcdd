// Resources of an executable file: a Windows program (PE, 32 or 64 bits), or a native stub (ELF),
// which carries the same resources as a .res file in its section ".moriv_res".
#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace machine {

inline constexpr char kNativeResourceSection[] = ".moriv_res";

// A resource of a file's bytes, whichever kind of executable it is, by numbers: type (5 dialog, 6
// strings, 16 version ...), id. It lies in `file`. nullopt for a file that is none or has none.
std::optional<std::span<const uint8_t>> FindProgramResource(std::span<const uint8_t> file, int type,
                                                            int id);

// What a Windows program has besides its sections.
struct ProgramExtent {
  uint64_t end = 0;  // of its last section, in the file; bytes may follow
  bool isSigned = false;
};

// nullopt for a file that is no Windows program.
std::optional<ProgramExtent> FindProgramExtent(std::span<const uint8_t> file);

// Bytes of the file's version resource (RT_VERSION), whichever kind of executable it is. nullopt
// for a file that is none, has none, or is damaged: every offset is checked before it is followed.
std::optional<std::vector<uint8_t>> ReadVersionResource(const std::filesystem::path& file);

// The same, of a file's bytes.
std::optional<std::vector<uint8_t>> FindVersionResource(std::span<const uint8_t> file);

// A value of a version resource, as VerQueryValueA knows it: path "\\VarFileInfo\\Translation" (raw
// bytes), "\\StringFileInfo\\040c04b0\\FileVersion" (8-bit text of the code page, without its NUL),
// "\\" (VS_FIXEDFILEINFO). Names compare without regard to case.
std::optional<std::vector<uint8_t>> QueryVersion(const std::vector<uint8_t>& resource,
                                                 const std::string& path);

}  // namespace machine

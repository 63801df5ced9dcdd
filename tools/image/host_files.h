// What the tool asks of its host beyond the standard library, with POSIX or by Windows. Descriptors
// are those of the C runtime; a call that fails leaves its reason in errno.
#pragma once

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <functional>
#include <optional>
#include <span>

namespace image {

// A file or a folder for reading, never waiting for anybody; -1 when it can't be had.
int OpenFile(const std::filesystem::path& path);
void CloseFile(int descriptor);

// Bytes of a plain file; nullopt for anything else.
std::optional<uint64_t> SizeOfPlainFile(int descriptor);

// Reads what the file has from `offset` on. Returns the number of bytes, 0 at its end, -1 for a
// failure. May be called from several threads.
int64_t ReadAt(int descriptor, uint64_t offset, std::span<uint8_t> bytes);

enum class FileKind { kData, kProgram };  // a program may be executed

// A new file for writing bytes, which can be deleted while it is open; nullptr when it can't be
// made, or when there is anything of that name.
std::FILE* CreateNewFile(const std::filesystem::path& path, FileKind kind);

// Has `cleanUp` called, on a thread of its own, when the process is told to end: by a signal or, on
// Windows, by its console. It ends then. To be called once, before there is a second thread.
void CleanUpWhenStopped(const std::function<void()>& cleanUp);

// Whether standard error is a terminal.
bool HasTerminal();

}  // namespace image

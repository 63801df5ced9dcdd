// The read-only attribute, which is the owner's write permission on the host. It is looked at here
// and never left to the host to refuse, since the host refuses its superuser nothing.
#pragma once

#include <filesystem>

namespace machine {

bool IsReadOnly(const std::filesystem::path& file);

// False when the host refuses.
bool SetReadOnly(const std::filesystem::path& file, bool readOnly);

// Makes a new file whose name ends in .exe executable, so that the host can start it.
void MarkProgram(const std::filesystem::path& file);

}  // namespace machine

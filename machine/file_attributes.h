// What the host's permissions say of a file. The read-only attribute is the owner's write
// permission: Locate reads it, and it is never left to the host to refuse, since the host refuses
// its superuser nothing.
#pragma once

#include <filesystem>

namespace machine {

// False when the host refuses, and for a file that has a second name on the host, since its
// attributes are that name's too.
bool SetReadOnly(const std::filesystem::path& file, bool readOnly);

// Makes a new file whose name ends in .exe executable, so that the host can start it.
void MarkProgram(const std::filesystem::path& file);

}  // namespace machine

// A stand-in machine copied to where what a program does to it harms nobody.
#pragma once

#include <filesystem>

namespace image {

// Copies all that stands in the folder to `copy`, which is new. A link that leads to another place
// of the machine leads to that place of the copy; one that leads out is not followed. What is
// neither folder nor file nor link becomes something that is none of them either. Throws a
// std::exception when something can't be read or written.
void CopyMachine(const std::filesystem::path& machine, const std::filesystem::path& copy);

// The path that a file of the machine has in the copy; a file that lies elsewhere keeps its own.
std::filesystem::path PathInCopy(const std::filesystem::path& file,
                                 const std::filesystem::path& machine,
                                 const std::filesystem::path& copy);

}  // namespace image

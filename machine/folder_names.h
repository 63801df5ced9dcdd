// The names in the host's folders, looked up without regard to case.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace machine {

// The name of what stands in the folder under this name in any case; `name` is in the code page,
// the answer as the host spells it. Of several the first in byte order, so that the answer does not
// hang on the host's order. Empty for nothing, and for a folder that can't be read.
//
// A large folder is read once. From then on the host tells of each change in it, whoever makes it;
// where the host can't, the folder is read every time, as small ones are.
std::string FindSpelling(const std::filesystem::path& folder, std::string_view name);

// Forgets all folders: another machine, with another code page, may come.
void ForgetFolders();

}  // namespace machine

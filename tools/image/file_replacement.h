// Files that take their names all together or not at all.
#pragma once

#include <filesystem>
#include <memory>
#include <vector>

#include "tools/image/output_file.h"

namespace image {

// Commits the files one after the other. What stood under a name is set aside meanwhile, as
// .moriv-old-N in its folder, and deleted when all have theirs. When one fails, those that have
// theirs go again, what was set aside comes back, and the failure is thrown on.
void CommitTogether(const std::vector<std::unique_ptr<OutputFile>>& files);

}  // namespace image

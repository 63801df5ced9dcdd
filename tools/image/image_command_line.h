// The command line of moriv-image.
#pragma once

#include <iosfwd>

namespace image {

// Does what the command line says and returns the exit status: 0, 1 when `verify` found something
// wrong or `diff` a difference, 2 for input that can't be used, with lines on `err` that say what
// is wrong, one for each fault. Warnings go there too.
int RunImageTool(int argc, const char* const* argv, std::ostream& out, std::ostream& err);

}  // namespace image

// The command line of moriv-machine.
#pragma once

#include <iosfwd>

namespace machine_tool {

// Does what the command line says and returns the exit status: 0, or 2 for input that can't be
// used, with one line on `err` that says what is wrong.
int RunMachineTool(int argc, const char* const* argv, std::ostream& out, std::ostream& err);

}  // namespace machine_tool

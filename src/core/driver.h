// A run as a whole: the help, the dialog, a silent install or a silent removal, by the options and
// the kind of image.
#pragma once

#include "core/context.h"

// Returns the exit code of the process: a StatusCode, or 0 after the help. docs/exit-codes.md lists
// what each path can give.
StatusCode RunSetup(SetupRequest request);

// The spine of a run: decides the mode from the options and the package's header, and shows the
// help, hands over to the dialog, or performs one of the two silent sequences.
#pragma once

#include "core/context.h"

// Returns the exit code of the process: a StatusCode, or 0 after the help. docs/exit-codes.md lists
// what each path can give.
StatusCode RunSetup(SetupRequest request);

// The help: the option list of the catalog with the disk space that the package needs.
#pragma once

#include "core/context.h"

// Shows the help in a message box, in the context's language. A silent run shows nothing: with a
// report file the space needed is appended there as event 38, without one nothing happens. The
// package must be closed; it is closed afterwards, and the context has no events.
void ShowHelp(SetupContext* context);

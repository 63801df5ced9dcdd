// Takes the product's files off the disk.
//
// No list of installed files exists: the pass resolves the records of the open package again, a
// setup image's or a removal program's, and deletes what it finds at their targets. A directory
// goes only when it is empty; a file that can't be deleted stays and stops nothing.
#pragma once

#include "core/context.h"

// Needs an open package and the product's installDir, which goes last. Adds event 11 for each file
// and 12 for each directory that it tries. Returns 1; StatusBadArgument; StatusCancelled, without
// an event; or a failure of the walk with its fatal event. What was deleted until then stays
// deleted, and the removal can be run again.
StatusCode RemoveProductFiles(SetupContext* context);

// Whether the package would change anything on a machine that has the product.
#pragma once

#include "core/context.h"

// Walks the records until one target is missing or older than its record; nothing is expanded.
// Returns 1, with event 35 added, when one was found; 0 when none was or the walk was given up (a
// stop by the user, a record that can't be read, a stream that can't be skipped); StatusBadArgument
// for a null context or a closed package, StatusSeekFailed with the package closed, or a failure of
// the resolver. Failures add no event.
int32_t DetectOlderFiles(SetupContext* context);

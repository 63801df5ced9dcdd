// The dialog: one window in which a user installs, updates or removes the product.
#pragma once

#include "core/context.h"

// Runs the whole dialog, releases what it used, the context's package and events included, and
// returns the StatusCode that ended it, the exit code of the run: 1 after a finished run,
// StatusCancelled, StatusDialogAborted from the button of the failure page, or the failure's own
// code.
StatusCode RunWizard(SetupContext* context);

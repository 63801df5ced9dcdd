// The dialog: one window in which a user installs, updates or removes the product.
#pragma once

#include "core/context.h"

// Opens the dialog and returns when its user has left it, with the package closed and the events
// freed. Returns the exit code of the run:
//   1                    the success page was left
//   StatusCancelled      Cancel was confirmed while no work went on: before it, or when it had come
//                        to its end behind the question; or the failure page of a run that was
//                        cancelled at work was left by Escape or the close box
//   StatusDialogAborted  a failure page was left by its button; or the system made no dialog, and
//                        then nothing has been opened
//   another failure      a failure page was left by Escape or the close box
StatusCode RunWizard(SetupContext* context);

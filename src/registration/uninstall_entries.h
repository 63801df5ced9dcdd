// What the program leaves in the system's keeping: the entry in the list of removable programs,
// and, after a removal, an INF file with the one-time command that makes the system delete the last
// files at its next start. A removal can't do that itself: the removal program runs from one of
// them, and the log is written after everything else.
//
// All answer 1 or 0, and nobody looks: whatever fails here, the run goes on. No events are added.
#pragma once

#include "core/context.h"

// Makes or renews the entry, named in the context's language. Withdraws a command that waits from
// an earlier removal, so that the removal program just written stays.
int WriteUninstallEntry(const SetupContext* context);

int DeleteUninstallEntry();

// Writes the INF file and registers the command.
int ScheduleFinalCleanup();

// Stores the command that processes the INF file at `infPath`; 0 also for a null or empty path.
int WriteRunOnceCommand(const char* infPath);

// 0 also when there was no command.
int CancelRunOnceCommand();

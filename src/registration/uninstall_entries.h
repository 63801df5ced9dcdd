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

// 0 also when there is no entry.
int DeleteUninstallEntry();

// Writes the INF file and registers the command.
int ScheduleFinalCleanup();

// Stores the command that processes the INF file at `infPath`. 0 also for a null or empty path, a
// system that doesn't tell its directory, and a command above 519 characters.
int WriteRunOnceCommand(const char* infPath);

// 0 also when there was no command. Makes the key of such commands where it is missing.
int CancelRunOnceCommand();

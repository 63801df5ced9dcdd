// What is left for the system to carry out: the entry by which a user removes the product, and,
// after a removal, the command by which Windows deletes the last files, once, when an administrator
// logs on. A removal can't delete them: it is running from one, and the log has yet to be written.
//
// All answer 1 or 0, and nobody looks: whatever fails here, the run goes on. No events are added.
#pragma once

#include "core/context.h"

// Makes or renews the entry, named in the context's language. Withdraws a command that waits from
// an earlier removal, so that the removal program just written stays.
int WriteUninstallEntry(const SetupContext* context);

// 0 also when there is no entry.
int DeleteUninstallEntry();

// Leaves the INF file and the command that has it processed.
int ScheduleFinalCleanup();

// Stores the command that processes the INF file at `infPath`. 0 also for a null or empty path, a
// system that doesn't tell its directory, and a command above 519 characters.
int WriteRunOnceCommand(const char* infPath);

// 0 also when there was no command. Makes the key of such commands where it is missing.
int CancelRunOnceCommand();

// Holds the user's commands back while a page is set up. A command that ran then could release the
// context under the running check for older files, or start a second handler. The first one that
// arrives is kept and comes again afterwards; further ones are dropped, as clicks on a busy window
// are.
#pragma once

#include "platform/win32.h"

void HoldCommands();

// Keeps the command, as WM_COMMAND brings it, if commands are held. False when they aren't.
bool HoldCommand(WPARAM command, HWND control);

// Ends the holding and posts the kept command, unless its control has been hidden, disabled,
// destroyed or renumbered meanwhile: then it no longer offers what the user clicked on.
void ReleaseCommands();

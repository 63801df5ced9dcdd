// Holds the user's commands back while a page is set up. A command that ran then could release the
// context under the running check for older files, or start a second handler. The first one that
// arrives is kept and comes again afterwards; further ones are dropped, as clicks on a busy window
// are.
#pragma once

#include "platform/win32.h"

// Commands are held while it lives; one at a time. Its end posts the kept command, unless the
// command's control has been hidden, disabled, destroyed or renumbered meanwhile: then it no longer
// offers what the user clicked on.
class CommandHold {
 public:
  CommandHold();
  ~CommandHold();
  CommandHold(const CommandHold&) = delete;
  CommandHold& operator=(const CommandHold&) = delete;
};

// Keeps the command, as WM_COMMAND brings it, if commands are held. False when they aren't.
bool KeepCommand(WPARAM command, HWND control);

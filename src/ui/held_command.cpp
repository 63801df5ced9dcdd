#include "ui/held_command.h"

#include "core/hooks.h"
#include "ui/dialog_controls.h"

namespace {

struct HeldCommand {
  bool isHolding;
  bool hasCommand;
  WPARAM command;
  HWND control;  // null when no control bears the command's id, as for Escape on an end page
};
HeldCommand held;

bool IsStillOffered() {
  if (held.control == nullptr) return true;
  if (IsWindow(held.control) == FALSE) return false;
  const LONG style = GetWindowLongA(held.control, GWL_STYLE);
  return GetWindowLongA(held.control, GWL_ID) == LOWORD(held.command) &&
         (style & WS_VISIBLE) != 0 && (style & WS_DISABLED) == 0;
}

}  // namespace

CommandHold::CommandHold() {
  held = {};
  held.isHolding = true;
}

CommandHold::~CommandHold() {
  held.isHolding = false;
  if (held.hasCommand && IsStillOffered()) {
    Post(WM_COMMAND, held.command, reinterpret_cast<LPARAM>(held.control));
  }
}

bool KeepCommand(WPARAM command, HWND control) {
  if (!held.isHolding) return false;
  if (!held.hasCommand) {
    held.hasCommand = true;
    held.command = command;
    held.control = control;
  }
  return true;
}

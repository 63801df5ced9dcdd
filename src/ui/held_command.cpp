#include "ui/held_command.h"

#include "core/hooks.h"

namespace {

struct HeldCommand {
  bool isOpen;
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

void HoldCommands() {
  held = {};
  held.isOpen = true;
}

bool HoldCommand(WPARAM command, HWND control) {
  if (!held.isOpen) return false;
  if (!held.hasCommand) {
    held.hasCommand = true;
    held.command = command;
    held.control = control;
  }
  return true;
}

void ReleaseCommands() {
  held.isOpen = false;
  if (held.hasCommand && IsStillOffered()) {
    PostMessageA(wizardState.window, WM_COMMAND, held.command,
                 reinterpret_cast<LPARAM>(held.control));
  }
}

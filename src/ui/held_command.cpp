#include "ui/held_command.h"

#include "core/hooks.h"

namespace {

struct HeldCommand {
  bool isHolding;
  bool isHeld;
  WPARAM command;
  HWND control;  // null for Escape and the close box
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
  held.isHolding = true;
}

bool HoldCommand(WPARAM command, HWND control) {
  if (!held.isHolding) return false;
  if (!held.isHeld) {
    held.isHeld = true;
    held.command = command;
    held.control = control;
  }
  return true;
}

void ReleaseCommands() {
  held.isHolding = false;
  if (held.isHeld && IsStillOffered()) {
    PostMessageA(wizardState.window, WM_COMMAND, held.command,
                 reinterpret_cast<LPARAM>(held.control));
  }
}

// What a scripted user sees of the dialog, as lines of standard output (docs/stand-in-machine.md).
#pragma once

namespace machine {

// Its title, the control with the focus and the default button.
void ShowFocus();

// The whole dialog, or for an id the line of the one control.
void ShowDialog(int id = 0);

// The controls' own fonts, and what was drawn on the owner-drawn controls that are shown, the
// entries of a list included.
void ShowDrawn();

}  // namespace machine

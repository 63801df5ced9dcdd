// What the system tells a dialog of the controls that the program draws itself.
#pragma once

#include "machine/windows.h"

namespace machine {

// A list is measured once, while the controls are created and before the dialog is initialised.
// Does nothing for other controls.
void MeasureItems(Window* control);

// Lets every owner-drawn control that is shown and has changed draw itself.
void DrawControls();

// Lets each entry of an owner-drawn list draw itself, as when the list is opened. None for another
// control.
std::vector<Drawing> DrawEntries(const Window& list);

// Tells of each entry of a list that goes, the last one first.
void DeleteItems(const Window& control);

}  // namespace machine

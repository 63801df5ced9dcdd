// The graphics system of the stand-in machine: objects are counted, drawing is recorded as text.
#pragma once

#include "machine/windows.h"

namespace machine {

// A device context on an owner-drawn control, whose recorded drawing begins anew. It is the
// system's own and counts for nobody.
HDC BeginDrawing(Window* control);
void EndDrawing(HDC dc);

}  // namespace machine

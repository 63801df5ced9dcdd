// The graphics system of the stand-in machine: objects are counted, drawing is recorded as text.
#pragma once

#include "machine/windows.h"

namespace machine {

// A device context on an owner-drawn control, whose recorded drawing begins anew. It is the
// system's own and counts for nobody. The record tells one call a line:
//   fill X,Y WxH BRUSH            "brush BBGGRR", or "none" for none of the program's
//   copy X,Y WxH BITMAP           "bitmap ID"
//   text "TEXT" X,Y WxH format N color BBGGRR on BBGGRR
//   focus
HDC BeginDrawing(Window* control);
void EndDrawing(HDC dc);

}  // namespace machine

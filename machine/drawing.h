// The graphics system of the stand-in machine: objects are counted, drawing is recorded as text.
#pragma once

#include "machine/windows.h"

namespace machine {

// A device context for an owner-drawn control or entry, whose drawing begins anew. It is the
// system's own and counts for nobody. The calls are:
//   fill X,Y WxH COLOR            "none" for no brush of the program's
//   picture ID X,Y WxH            of the bitmap resource; "none" for none of the program's
//   text "TEXT" X,Y format N COLOR on COLOR
//   focus
HDC BeginDrawing(Drawing* drawing);
void EndDrawing(HDC dc);

// "FACE" HEIGHT WEIGHT and, where they are, "italic", "underlined"; "gone" for a font that has been
// deleted, "none" for null.
std::string DescribeFont(HGDIOBJ font);

}  // namespace machine

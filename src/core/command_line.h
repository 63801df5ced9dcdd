// The command line: options behind "/" or "-".
//
// "/" is the stronger marker: as long as a "/" lies ahead, every "-" is plain text of the current
// option. Blanks don't separate options and quotes mean nothing, so that a path with blanks needs
// no quotes. What isn't recognised is dropped in silence.
#pragma once

#include "core/context.h"

// The text behind the program's name in a process's whole command line. A name in quotes ends at
// the closing quote, another one at the first blank or tab; blanks and tabs behind it are skipped.
// Returns null for null.
const char* SkipProgramName(const char* commandLine);

// Applies each option of the line to the request, from left to right. An option text of 260
// characters or more has no effect: half a path is worse than none. Returns 1, or
// 0 for a null argument and for a line without a marker.
int ParseCommandLine(const char* line, SetupRequest* request);

// Applies one option text, without its marker. Does nothing for a null or empty text or a null
// request.
void ApplyOption(const char* text, SetupRequest* request);

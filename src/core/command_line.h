// The command line: options behind "/" or "-".
//
// A "-" marks an option only behind the last "/" of the line; in front of it hyphens are text. Nor
// do blanks end an option, and a quote is a character like any other: a path with blanks needs
// none. What isn't recognised is dropped in silence.
#pragma once

#include "core/context.h"

// The text behind the program's name in a process's whole command line. A name in quotes ends at
// the closing quote, another one at the first blank or tab; blanks and tabs behind it are skipped.
// Returns null for null.
const char* SkipProgramName(const char* commandLine);

// Applies each option of the line to the request, from left to right. An option text of 260
// characters or more has no effect: half a path is worse than none. Returns 1, or 0
// for a null argument and for a line without a marker.
int ParseCommandLine(const char* line, SetupRequest* request);

// Applies one option text, without its marker. Does nothing for a null or empty text or a null
// request.
void ApplyOption(const char* text, SetupRequest* request);

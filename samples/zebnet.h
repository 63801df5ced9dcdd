// The library of the sample programs.
#pragma once

#include <stddef.h>

#ifdef zebnet_EXPORTS
#define ZEBNET_FUNCTION __declspec(dllexport)
#else
#define ZEBNET_FUNCTION __declspec(dllimport)
#endif

extern "C" {

// Version of the library, such as "4.1.7". Belongs to the library.
ZEBNET_FUNCTION const char* ZebNetVersion();

// Writes a telephone number in groups of two digits: "0102030405" as "01 02 03 04 05". Characters
// that are no digits are dropped; an odd number of digits leaves its last one alone.
//   text  `size` bytes, the NUL included
// Returns the length of the text, or 0, with `text` empty if it has room for that, when a pointer
// is null, the number has no digits or the text does not fit.
ZEBNET_FUNCTION int ZebNetFormatNumber(const char* number, char* text, size_t size);

}  // extern "C"

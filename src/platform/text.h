// Bounded work on 8-bit, NUL-terminated texts in fixed buffers. Sizes are bytes, the NUL included.
// No text may be null, but for IsMissingOrEmpty.
#pragma once

#include <cstddef>
#include <cstring>

// Lets the compiler check arguments against the format: parameter f, arguments from parameter a.
#ifdef _WIN32
#define MORIV_PRINTF_LIKE(f, a) __attribute__((format(ms_printf, f, a)))
#else
#define MORIV_PRINTF_LIKE(f, a) __attribute__((format(printf, f, a)))
#endif

// Room for a path of 259 characters, as everywhere in the system's 8-bit interface.
inline constexpr size_t kPathSize = 260;

// Copies or appends `text`. False, with the destination unchanged, when it doesn't fit whole.
bool CopyText(char* destination, size_t size, const char* text);
bool AppendText(char* destination, size_t size, const char* text);

// printf into a buffer. False, with the destination empty, when the result doesn't fit whole: no
// caller has a use for the beginning of a path or of a command.
bool FormatText(char* destination, size_t size, const char* format, ...) MORIV_PRINTF_LIKE(3, 4);

// Cuts blanks (code 32 alone) from the end, in place. The first character is never cut.
void CutTrailingBlanks(char* text);

// Compare without regard to the case of the letters A to Z.
bool EqualIgnoringCase(const char* a, const char* b);
bool BeginsWithIgnoringCase(const char* text, const char* prefix);

template <size_t N>
bool CopyText(char (&destination)[N], const char* text) {
  return CopyText(destination, N, text);
}
template <size_t N>
bool AppendText(char (&destination)[N], const char* text) {
  return AppendText(destination, N, text);
}

inline bool IsMissingOrEmpty(const char* text) {
  return text == nullptr || *text == '\0';
}

// A copy of a record's text field that always ends in a NUL: a damaged package can fill a field to
// its width, and such a text ends there.
template <size_t N>
struct TextField {
  char text[N + 1];

  explicit TextField(const char (&field)[N]) {
    memcpy(text, field, N);
    text[N] = '\0';
  }
};

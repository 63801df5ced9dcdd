#include "platform/text.h"

#include <cstdarg>
#include <cstdio>

namespace {

char LowerCase(char c) {
  return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

}  // namespace

bool CopyText(char* destination, size_t size, const char* text) {
  const size_t length = strlen(text);
  if (length >= size) return false;
  memcpy(destination, text, length + 1);
  return true;
}

bool AppendText(char* destination, size_t size, const char* text) {
  const size_t used = strlen(destination);
  return used < size && CopyText(destination + used, size - used, text);
}

bool FormatText(char* destination, size_t size, const char* format, ...) {
  if (size == 0) return false;
  va_list arguments;
  va_start(arguments, format);
#ifdef _WIN32
  // The system runtime's own: it answers -1 and leaves out the NUL when the text doesn't fit, and
  // it leaves the NUL out also when the text fills the buffer exactly.
  const int length = _vsnprintf(destination, size, format, arguments);
#else
  const int length = vsnprintf(destination, size, format, arguments);
#endif
  va_end(arguments);
  if (length >= 0 && static_cast<size_t>(length) < size) return true;
  destination[0] = '\0';
  return false;
}

void CutTrailingBlanks(char* text) {
  size_t length = strlen(text);
  while (length > 1 && text[length - 1] == ' ') text[--length] = '\0';
}

bool EqualIgnoringCase(const char* a, const char* b) {
  while (*a != '\0' && LowerCase(*a) == LowerCase(*b)) ++a, ++b;
  return LowerCase(*a) == LowerCase(*b);
}

bool BeginsWithIgnoringCase(const char* text, const char* prefix) {
  while (*prefix != '\0' && LowerCase(*text) == LowerCase(*prefix)) ++text, ++prefix;
  return *prefix == '\0';
}

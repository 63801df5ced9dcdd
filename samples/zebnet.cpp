#include "samples/zebnet.h"

const char* ZebNetVersion() {
  return "4.1.7";
}

int ZebNetFormatNumber(const char* number, char* text, size_t size) {
  if (text == nullptr || size == 0) return 0;
  text[0] = '\0';
  if (number == nullptr) return 0;

  size_t length = 0;
  int digits = 0;
  for (; *number != '\0'; ++number) {
    if (*number < '0' || *number > '9') continue;
    const bool opensGroup = digits > 0 && digits % 2 == 0;
    const size_t needed = opensGroup ? 2 : 1;
    if (length + needed >= size) {  // One byte is kept for the NUL.
      text[0] = '\0';
      return 0;
    }
    if (opensGroup) text[length++] = ' ';
    text[length++] = *number;
    ++digits;
  }
  text[length] = '\0';
  return static_cast<int>(length);
}

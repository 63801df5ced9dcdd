#include <windows.h>

#include "machine/host_characters.h"

namespace machine {

std::array<char16_t, 256> CharactersOf(int codePage) {
  std::array<char16_t, 256> characters;
  for (unsigned byte = 0; byte < 256; ++byte) {
    const char in = static_cast<char>(byte);
    wchar_t out[2] = {};
    const int count =
        MultiByteToWideChar(static_cast<UINT>(codePage), MB_ERR_INVALID_CHARS, &in, 1, out, 2);
    characters[byte] = static_cast<char16_t>(byte < 0x80 || count != 1 ? byte : out[0]);
  }
  return characters;
}

char16_t ToUpperCharacter(char16_t character) {
  wchar_t text[] = {character, L'\0'};
  CharUpperBuffW(text, 1);
  return text[0];
}

}  // namespace machine

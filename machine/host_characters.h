// What the host knows of characters.
#pragma once

#include <array>

namespace machine {

// The character of each byte of a single-byte code page; the byte's own value where the page gives
// it none, and for every byte above 0x7F when the host doesn't know the page.
std::array<char16_t, 256> CharactersOf(int codePage);

// The character itself when it has no upper case.
char16_t ToUpperCharacter(char16_t character);

}  // namespace machine

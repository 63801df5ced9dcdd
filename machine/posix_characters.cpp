#include <iconv.h>
#include <locale.h>
#include <wctype.h>

#include <string>

#include "machine/host_characters.h"

namespace machine {
namespace {

char16_t CharacterOf(iconv_t converter, unsigned char byte) {
  if (converter == reinterpret_cast<iconv_t>(-1)) return byte;
  iconv(converter, nullptr, nullptr, nullptr, nullptr);
  char in = static_cast<char>(byte);
  char* inAt = &in;
  size_t inLeft = 1;
  char16_t out[2] = {};
  char* outAt = reinterpret_cast<char*>(out);
  size_t outLeft = sizeof(out);
  const size_t result = iconv(converter, &inAt, &inLeft, &outAt, &outLeft);
  const bool oneUnit = result == 0 && inLeft == 0 && outLeft == sizeof(out) - sizeof(char16_t);
  return oneUnit ? out[0] : byte;
}

}  // namespace

std::array<char16_t, 256> CharactersOf(int codePage) {
  std::array<char16_t, 256> characters;
  const iconv_t converter = iconv_open("UTF-16LE", ("CP" + std::to_string(codePage)).c_str());
  for (unsigned byte = 0; byte < 256; ++byte) {
    const auto index = static_cast<unsigned char>(byte);
    characters[byte] = byte < 0x80 ? index : CharacterOf(converter, index);
  }
  if (converter != reinterpret_cast<iconv_t>(-1)) iconv_close(converter);
  return characters;
}

char16_t ToUpperCharacter(char16_t character) {
  static const locale_t locale = newlocale(LC_CTYPE_MASK, "C.UTF-8", nullptr);
  const wint_t upper = locale != nullptr ? towupper_l(character, locale) : towupper(character);
  return static_cast<char16_t>(upper);
}

}  // namespace machine

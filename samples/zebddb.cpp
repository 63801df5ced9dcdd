// A sample of a service directory: lists the services that it knows, with their numbers.
#define WIN32_LEAN_AND_MEAN
#include <windows.h>

#include <stdio.h>

#include "samples/zebnet.h"

namespace {

struct Service {
  const char* name;
  const char* number;
};

// The numbers belong to a range that is kept free for fiction.
constexpr Service kServices[] = {
    {"News", "0199001001"},
    {"Weather", "0199001002"},
    {"Games", "0199001003"},
};

}  // namespace

int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int) {
  char text[512];
  size_t length = 0;
  const auto append = [&](const char* first, const char* second) {
    const int added = snprintf(text + length, sizeof(text) - length, "%s: %s\n", first, second);
    if (added > 0 && static_cast<size_t>(added) < sizeof(text) - length) {
      length += static_cast<size_t>(added);
    }
  };
  for (const Service& service : kServices) {
    char number[32];
    ZebNetFormatNumber(service.number, number, sizeof(number));
    append(service.name, number);
  }
  append("\nzebnet.dll", ZebNetVersion());
  MessageBoxA(nullptr, text, "zebddb", MB_OK | MB_ICONINFORMATION);
  return 0;
}

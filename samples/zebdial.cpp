// A sample of a dialler: tells the number that it would dial. The number is the command line's, or
// one of a range that is kept free for fiction.
#define WIN32_LEAN_AND_MEAN
#include <windows.h>

#include <stdio.h>

#include "samples/zebnet.h"

namespace {

constexpr char kDemonstrationNumber[] = "0199001234";

}  // namespace

int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR commandLine, int) {
  char number[64];
  if (ZebNetFormatNumber(commandLine, number, sizeof(number)) == 0) {
    ZebNetFormatNumber(kDemonstrationNumber, number, sizeof(number));
  }
  char text[160];
  snprintf(text, sizeof(text), "This sample would dial %s.\n\nzebnet.dll %s", number,
           ZebNetVersion());
  MessageBoxA(nullptr, text, "zebdial", MB_OK | MB_ICONINFORMATION);
  return 0;
}

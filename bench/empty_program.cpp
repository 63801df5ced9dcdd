// A program that does nothing: what any program costs under Wine.
#include "platform/win32.h"

int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int) {
  return 1;  // as the setup program, 1 is success
}

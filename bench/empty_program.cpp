// A program that does nothing, but has the libraries loaded that the setup program has: what any
// such program costs under Wine.
#include "platform/win32.h"

namespace {

// One function of each library, never called.
const volatile void* volatile imported;

template <class Function>
void Import(Function* function) {
  imported = reinterpret_cast<const volatile void*>(function);
}

}  // namespace

int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int) {
  Import(&RegCloseKey);    // ADVAPI32
  Import(&DeleteObject);   // GDI32
  Import(&ShellExecuteA);  // SHELL32
  Import(&PeekMessageA);   // USER32
  return 1;                // as the setup program, 1 is success
}

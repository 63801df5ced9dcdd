// Where Windows starts the process. The C runtime's start-up code stays out: it takes the letters
// of the program's name for signed numbers, so that one with an accent ends the name too early; its
// objects need a newer processor than the program; and with no static object to construct and no
// main() it has nothing to do here. The runtime's library prepares itself when it is loaded.
#include <cstdint>
#include <cstdlib>

#include "platform/entry.h"
#include "platform/win32.h"

// What the compiler puts behind a frame's buffers, and calls when it has been overwritten.
extern "C" {
uintptr_t __stack_chk_guard = 0xFF0A0D00;  // a text that ran over can't hold it
[[noreturn]] void __stack_chk_fail() {
  abort();
}
}

// The linker's name for the entry of a program with windows.
extern "C" [[noreturn]] void WinMainCRTStartup() {
  ExitProcess(static_cast<UINT>(RunProgram()));
}

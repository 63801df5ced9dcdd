// Where Windows starts the process. The C runtime's start-up code stays out: it takes the letters of
// the program's name for signed numbers, so that one with an accent ends the name too early; its
// objects need a newer processor than the program; and with no static object to construct and no
// main() it has nothing to do here. The runtime's library prepares itself when it is loaded.
#include "platform/entry.h"
#include "platform/win32.h"

// The linker's name for the entry of a program with windows.
extern "C" [[noreturn]] void WinMainCRTStartup() {
  ExitProcess(static_cast<UINT>(RunProgram()));
}

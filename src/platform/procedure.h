// Looks a function up in a loaded module, with its type. Null when the module lacks it.
#pragma once

#include "platform/win32.h"

template <typename Function>
Function FindProcedure(HMODULE module, const char* name) {
  // By way of void*: compilers warn of a cast between unlike function types, which is the very
  // purpose here.
  return reinterpret_cast<Function>(reinterpret_cast<void*>(GetProcAddress(module, name)));
}

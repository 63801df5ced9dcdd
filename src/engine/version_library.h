// The system's version functions. They are looked up in version.dll by its full path in the system
// directory: as imports they would be taken from a version.dll beside the program, if one lay
// there.
#pragma once

#include "platform/win32.h"

class VersionLibrary {
 public:
  VersionLibrary();
  ~VersionLibrary();
  VersionLibrary(const VersionLibrary&) = delete;
  VersionLibrary& operator=(const VersionLibrary&) = delete;

  // False when the system has no such library; then the functions are null.
  bool IsLoaded() const { return getSize != nullptr && getInfo != nullptr && query != nullptr; }

  decltype(&GetFileVersionInfoSizeA) getSize = nullptr;
  decltype(&GetFileVersionInfoA) getInfo = nullptr;
  decltype(&VerQueryValueA) query = nullptr;

 private:
  HMODULE module_ = nullptr;
};

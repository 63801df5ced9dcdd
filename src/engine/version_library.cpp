#include "engine/version_library.h"

#include "platform/procedure.h"
#include "platform/text.h"

VersionLibrary::VersionLibrary() {
  char path[2 * kPathSize] = {};
  const UINT length = GetSystemDirectoryA(path, kPathSize);
  if (length == 0 || length >= kPathSize || !AppendText(path, "\\version.dll")) return;
  module_ = LoadLibraryA(path);
  if (module_ == nullptr) return;
  getSize = FindProcedure<decltype(getSize)>(module_, "GetFileVersionInfoSizeA");
  getInfo = FindProcedure<decltype(getInfo)>(module_, "GetFileVersionInfoA");
  query = FindProcedure<decltype(query)>(module_, "VerQueryValueA");
}

VersionLibrary::~VersionLibrary() {
  if (module_ != nullptr) FreeLibrary(module_);
}

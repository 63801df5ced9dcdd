// The one guard of an open registry key: closes it on every path.
#pragma once

#include "platform/win32.h"

class RegistryKey {
 public:
  RegistryKey() = default;
  ~RegistryKey() { Close(); }
  RegistryKey(const RegistryKey&) = delete;
  RegistryKey& operator=(const RegistryKey&) = delete;

  // Opens the key `path` under `parent`, or makes what is missing of it with full access. True with
  // the key open; a key that was open before is closed first.
  bool Open(HKEY parent, const char* path, REGSAM access);
  bool Create(HKEY parent, const char* path);
  void Close();

  // Stores `size` bytes of `text` as REG_SZ. The size says whether the NUL is stored with it.
  bool SetText(const char* name, const char* text, DWORD size) const;

  HKEY get() const { return key_; }

 private:
  HKEY key_ = nullptr;
};

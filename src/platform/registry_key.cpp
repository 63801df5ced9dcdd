#include "platform/registry_key.h"

bool RegistryKey::Open(HKEY parent, const char* path, REGSAM access) {
  Close();
  if (RegOpenKeyExA(parent, path, 0, access, &key_) == ERROR_SUCCESS) return true;
  key_ = nullptr;
  return false;
}

bool RegistryKey::Create(HKEY parent, const char* path) {
  Close();
  if (RegCreateKeyExA(parent, path, 0, nullptr, REG_OPTION_NON_VOLATILE, KEY_ALL_ACCESS, nullptr,
                      &key_, nullptr) == ERROR_SUCCESS) {
    return true;
  }
  key_ = nullptr;
  return false;
}

void RegistryKey::Close() {
  if (key_ != nullptr) RegCloseKey(key_);
  key_ = nullptr;
}

bool RegistryKey::SetText(const char* name, const char* text, DWORD size) const {
  return RegSetValueExA(key_, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text), size) ==
         ERROR_SUCCESS;
}

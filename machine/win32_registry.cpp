// The registry functions. Windows checks a handle's rights where values are read or written and
// subkeys listed; making, opening and deleting subkeys goes by the rights of the keys themselves,
// which nobody restricts here but for a registry that is read-only as a whole. On the 9x family no
// rights are checked at all: this is stricter.
#include <cstring>
#include <map>
#include <memory>

#include "machine/faults.h"
#include "machine/machine.h"
#include "machine/open_objects.h"
#include "machine/registry_store.h"
#include "platform/win32.h"

using machine::RegistryKey;
using machine::RegistryValue;

namespace {

constexpr REGSAM kQueryValue = 0x1;
constexpr REGSAM kSetValue = 0x2;
constexpr REGSAM kEnumerateSubkeys = 0x8;

constexpr LSTATUS kErrorBadPathname = 161;
constexpr LSTATUS kErrorKeyDeleted = 1018;

constexpr DWORD kCreatedNewKey = 1;
constexpr DWORD kOpenedExistingKey = 2;

struct OpenKey {
  std::shared_ptr<RegistryKey> key;
  REGSAM access = 0;
};

std::map<HKEY, OpenKey> openKeys;

HKEY OpenHandle(std::shared_ptr<RegistryKey> key, REGSAM access) {
  static uintptr_t last = 0;
  const HKEY handle = reinterpret_cast<HKEY>(last += 4);
  openKeys[handle] = {std::move(key), access};
  ObjectOpened(machine::ObjectKind::kKey);
  return handle;
}

bool IsPredefined(HKEY handle) {
  return handle == HKEY_LOCAL_MACHINE || handle == HKEY_CLASSES_ROOT;
}

std::shared_ptr<RegistryKey> PredefinedKey(HKEY handle) {
  const std::shared_ptr<RegistryKey> root = machine::LocalMachine();
  return root != nullptr && handle == HKEY_CLASSES_ROOT
             ? machine::MakeKey(root, machine::kClassesPath)
             : root;
}

// The key behind a handle, in `key`, if it was opened with the rights asked for.
LSTATUS Resolve(HKEY handle, REGSAM access, std::shared_ptr<RegistryKey>* key) {
  if (IsPredefined(handle)) {
    *key = PredefinedKey(handle);
    return *key != nullptr ? ERROR_SUCCESS : ERROR_INVALID_HANDLE;
  }
  const auto found = openKeys.find(handle);
  if (found == openKeys.end()) return ERROR_INVALID_HANDLE;
  *key = found->second.key;
  if ((*key)->deleted) return kErrorKeyDeleted;
  return (found->second.access & access) == access ? ERROR_SUCCESS : ERROR_ACCESS_DENIED;
}

// Whether a path from a key can name one at all.
LSTATUS CheckPath(LPCSTR path) {
  if (*path == '\\' && machine::CurrentSettings().ntFamily) return kErrorBadPathname;
  return machine::SplitKeyPath(path) ? ERROR_SUCCESS : ERROR_INVALID_PARAMETER;
}

const char* TextOrEmpty(LPCSTR text) {
  return text != nullptr ? text : "";
}

}  // namespace

extern "C" {

LSTATUS RegOpenKeyExA(HKEY key, LPCSTR subkey, DWORD, REGSAM access, PHKEY result) {
  DWORD fault = 0;
  if (machine::CallFails("RegOpenKeyExA", &fault)) return static_cast<LSTATUS>(fault);
  if (result == nullptr) return ERROR_INVALID_PARAMETER;
  *result = nullptr;
  std::shared_ptr<RegistryKey> parent;
  if (const LSTATUS status = Resolve(key, 0, &parent)) return status;
  const char* path = TextOrEmpty(subkey);
  if (const LSTATUS status = CheckPath(path)) return status;
  // A predefined key opened again is itself: it needs no handle.
  if (*path == '\0' && IsPredefined(key)) {
    *result = key;
    return ERROR_SUCCESS;
  }
  const std::shared_ptr<RegistryKey> found = machine::FindKey(parent, path);
  if (found == nullptr) return ERROR_FILE_NOT_FOUND;
  const bool isReadOnly = machine::CurrentSettings().hasReadOnlyRegistry;
  if (isReadOnly && (access & ~REGSAM{KEY_READ}) != 0) return ERROR_ACCESS_DENIED;
  *result = OpenHandle(found, access);
  return ERROR_SUCCESS;
}

// A volatile key is kept like any other; class and security are not kept.
LSTATUS RegCreateKeyExA(HKEY key, LPCSTR subkey, DWORD reserved, LPSTR, DWORD, REGSAM access,
                        const SECURITY_ATTRIBUTES*, PHKEY result, LPDWORD disposition) {
  DWORD fault = 0;
  if (machine::CallFails("RegCreateKeyExA", &fault)) return static_cast<LSTATUS>(fault);
  if (subkey == nullptr || result == nullptr || reserved != 0) return ERROR_INVALID_PARAMETER;
  *result = nullptr;
  std::shared_ptr<RegistryKey> parent;
  if (const LSTATUS status = Resolve(key, 0, &parent)) return status;
  if (const LSTATUS status = CheckPath(subkey)) return status;
  std::shared_ptr<RegistryKey> found = machine::FindKey(parent, subkey);
  const bool isNew = found == nullptr;
  if (isNew) {
    found = machine::MakeKey(parent, subkey);
    machine::SaveRegistry();
  }
  if (disposition != nullptr) *disposition = isNew ? kCreatedNewKey : kOpenedExistingKey;
  *result = OpenHandle(found, access);
  return ERROR_SUCCESS;
}

// Windows adds a NUL to a text stored without one when the buffer has room for it; the count that
// it gives is the stored one all the same. Here nothing stands behind that count, so that a program
// which leans on the NUL is found out.
LSTATUS RegQueryValueExA(HKEY key, LPCSTR name, LPDWORD reserved, LPDWORD type, BYTE* data,
                         LPDWORD size) {
  DWORD fault = 0;
  if (machine::CallFails("RegQueryValueExA", &fault)) return static_cast<LSTATUS>(fault);
  if (reserved != nullptr || (data != nullptr && size == nullptr)) return ERROR_INVALID_PARAMETER;
  std::shared_ptr<RegistryKey> found;
  if (const LSTATUS status = Resolve(key, kQueryValue, &found)) return status;
  const RegistryValue* value = machine::FindValue(*found, TextOrEmpty(name));
  if (value == nullptr) return ERROR_FILE_NOT_FOUND;

  if (type != nullptr) *type = value->type;
  if (size == nullptr) return ERROR_SUCCESS;
  const DWORD room = *size;
  *size = static_cast<DWORD>(value->data.size());
  if (data == nullptr) return ERROR_SUCCESS;
  if (room < value->data.size()) return ERROR_MORE_DATA;
  if (!value->data.empty()) std::memcpy(data, value->data.data(), value->data.size());
  return ERROR_SUCCESS;
}

// The default value of a key or of one below it, a REG_SZ, which gets a NUL behind it if it has
// none and the buffer has room. A key without that value answers an empty text.
LSTATUS RegQueryValueA(HKEY key, LPCSTR subkey, LPSTR data, LONG* size) {
  constexpr LSTATUS kInvalidData = 13;
  DWORD fault = 0;
  if (machine::CallFails("RegQueryValueA", &fault)) return static_cast<LSTATUS>(fault);
  if (size == nullptr || *size < 0) return ERROR_INVALID_PARAMETER;
  std::shared_ptr<RegistryKey> found;
  if (const LSTATUS status = Resolve(key, kQueryValue, &found)) return status;
  const std::string path = TextOrEmpty(subkey);
  if (!path.empty()) found = machine::FindKey(found, path);
  if (found == nullptr) return ERROR_FILE_NOT_FOUND;

  const RegistryValue* const value = machine::FindValue(*found, "");
  if (value != nullptr && value->type != REG_SZ) return kInvalidData;
  const std::string text =
      value != nullptr ? std::string(value->data.begin(), value->data.end()) : std::string(1, '\0');
  const size_t room = static_cast<size_t>(*size);
  *size = static_cast<LONG>(text.size());
  if (data == nullptr) return ERROR_SUCCESS;
  if (room < text.size()) return ERROR_MORE_DATA;
  std::memcpy(data, text.data(), text.size());
  if (room > text.size()) data[text.size()] = '\0';
  return ERROR_SUCCESS;
}

LSTATUS RegSetValueExA(HKEY key, LPCSTR name, DWORD reserved, DWORD type, const BYTE* data,
                       DWORD size) {
  DWORD fault = 0;
  if (machine::CallFails("RegSetValueExA", &fault)) return static_cast<LSTATUS>(fault);
  if (reserved != 0 || (data == nullptr && size != 0)) return ERROR_INVALID_PARAMETER;
  if (!machine::IsValueName(TextOrEmpty(name))) return ERROR_INVALID_PARAMETER;
  std::shared_ptr<RegistryKey> found;
  if (const LSTATUS status = Resolve(key, kSetValue, &found)) return status;

  RegistryValue* value = machine::FindValue(*found, TextOrEmpty(name));
  if (value == nullptr) {
    value = &found->values.emplace_back();
    value->name = TextOrEmpty(name);
  }
  value->type = type;
  value->data.clear();
  if (size != 0) value->data.assign(data, data + size);
  machine::SaveRegistry();
  return ERROR_SUCCESS;
}

LSTATUS RegDeleteKeyA(HKEY key, LPCSTR subkey) {
  DWORD fault = 0;
  if (machine::CallFails("RegDeleteKeyA", &fault)) return static_cast<LSTATUS>(fault);
  if (subkey == nullptr) return ERROR_INVALID_PARAMETER;
  std::shared_ptr<RegistryKey> parent;
  if (const LSTATUS status = Resolve(key, 0, &parent)) return status;
  if (const LSTATUS status = CheckPath(subkey)) return status;
  const std::shared_ptr<RegistryKey> found = machine::FindKey(parent, subkey);
  if (found == nullptr) return ERROR_FILE_NOT_FOUND;
  const bool isRoot = found->parent == nullptr;
  const bool keptBySubkeys = machine::CurrentSettings().ntFamily && !found->subkeys.empty();
  if (isRoot || keptBySubkeys) return ERROR_ACCESS_DENIED;
  machine::DeleteKey(found.get());
  machine::SaveRegistry();
  return ERROR_SUCCESS;
}

LSTATUS RegDeleteValueA(HKEY key, LPCSTR name) {
  DWORD fault = 0;
  if (machine::CallFails("RegDeleteValueA", &fault)) return static_cast<LSTATUS>(fault);
  std::shared_ptr<RegistryKey> found;
  if (const LSTATUS status = Resolve(key, kSetValue, &found)) return status;
  const RegistryValue* value = machine::FindValue(*found, TextOrEmpty(name));
  if (value == nullptr) return ERROR_FILE_NOT_FOUND;
  found->values.erase(found->values.begin() + (value - found->values.data()));
  machine::SaveRegistry();
  return ERROR_SUCCESS;
}

LSTATUS RegEnumKeyA(HKEY key, DWORD index, LPSTR name, DWORD size) {
  DWORD fault = 0;
  if (machine::CallFails("RegEnumKeyA", &fault)) return static_cast<LSTATUS>(fault);
  if (name == nullptr) return ERROR_INVALID_PARAMETER;
  std::shared_ptr<RegistryKey> found;
  if (const LSTATUS status = Resolve(key, kEnumerateSubkeys, &found)) return status;
  if (index >= found->subkeys.size()) return ERROR_NO_MORE_ITEMS;
  const std::string& subkeyName = found->subkeys[index]->name;
  if (subkeyName.size() >= size) return ERROR_MORE_DATA;
  std::memcpy(name, subkeyName.c_str(), subkeyName.size() + 1);
  return ERROR_SUCCESS;
}

// A fault makes the answer a failure; the key is closed all the same.
LSTATUS RegCloseKey(HKEY key) {
  DWORD fault = ERROR_SUCCESS;
  (void)machine::CallFails("RegCloseKey", &fault);
  if (IsPredefined(key)) return static_cast<LSTATUS>(fault);
  if (openKeys.erase(key) == 0) return ERROR_INVALID_HANDLE;
  ObjectClosed(machine::ObjectKind::kKey);
  return static_cast<LSTATUS>(fault);
}

}  // extern "C"

// The registry: rights, sizes, and what a key or a value that is not there answers.
#include <cstring>

#include "tests/contract/contract.h"

using contract::Expect;

namespace {

constexpr LSTATUS kErrorBadPathname = 161;
constexpr LSTATUS kErrorKeyDeleted = 1018;
const HKEY kMachine = HKEY_LOCAL_MACHINE;

HKEY Make(HKEY parent, const std::string& path, REGSAM access = KEY_ALL_ACCESS) {
  HKEY key = nullptr;
  Expect(RegCreateKeyExA(parent, path.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE, access, nullptr,
                         &key, nullptr),
         ERROR_SUCCESS, path);
  return key;
}

// A key of the case, closed at its end.
class CaseKey {
 public:
  explicit CaseKey(const std::string& below = "", REGSAM access = KEY_ALL_ACCESS)
      : key_(Make(kMachine, contract::kKey + below, access)) {}
  ~CaseKey() { RegCloseKey(key_); }
  CaseKey(const CaseKey&) = delete;
  CaseKey& operator=(const CaseKey&) = delete;
  operator HKEY() const { return key_; }

 private:
  HKEY key_;
};

std::string Below(const char* path) {
  return std::string(contract::kKey) + path;
}

// Status of an open that is closed again at once.
LSTATUS Open(HKEY parent, const std::string& path) {
  HKEY key = nullptr;
  const LSTATUS status = RegOpenKeyExA(parent, path.c_str(), 0, KEY_READ, &key);
  if (status == ERROR_SUCCESS) RegCloseKey(key);
  return status;
}

LSTATUS Set(HKEY key, const char* name, const char* bytes, DWORD size, DWORD type = REG_SZ) {
  return RegSetValueExA(key, name, 0, type, reinterpret_cast<const BYTE*>(bytes), size);
}

}  // namespace

CONTRACT(Registry, PathsAreMadeWholeAndFoundInAnyCase) {
  DWORD disposition = 0;
  HKEY key = nullptr;
  const std::string path = Below("\\Made\\Whole");
  for (const DWORD expected : {1u, 2u}) {  // made, opened
    Expect(RegCreateKeyExA(kMachine, path.c_str(), 0, nullptr, 0, KEY_READ, nullptr, &key,
                           &disposition),
           ERROR_SUCCESS);
    Expect(disposition, expected);
    Expect(Open(key, ""), ERROR_SUCCESS);
    Expect(RegCloseKey(key), ERROR_SUCCESS);
  }
  Expect(Open(kMachine, "software\\zEB\\CONTRACT\\made"), ERROR_SUCCESS);
  Expect(Open(kMachine, path + "\\"), ERROR_SUCCESS);
  Expect(Open(kMachine, Below("\\Made\\\\Whole")), ERROR_SUCCESS);
  Expect(Open(kMachine, Below("\\Other")), ERROR_FILE_NOT_FOUND);
  Expect(Open(kMachine, Below("\\Other\\Below")), ERROR_FILE_NOT_FOUND);
  Expect(Open(kMachine, "\\" + path), kErrorBadPathname);
  Expect(Open(kMachine, ""), ERROR_SUCCESS);
  Expect(RegOpenKeyExA(kMachine, nullptr, 0, KEY_READ, &key), ERROR_SUCCESS);
  RegCloseKey(key);
}

CONTRACT(Registry, ClassesAreKeysOfTheMachine) {
  RegCloseKey(Make(HKEY_CLASSES_ROOT, "contract.test"));
  Expect(Open(kMachine, "SOFTWARE\\Classes\\contract.test"), ERROR_SUCCESS);
  Expect(RegDeleteKeyA(HKEY_CLASSES_ROOT, "contract.test"), ERROR_SUCCESS);
  Expect(Open(kMachine, "SOFTWARE\\Classes\\contract.test"), ERROR_FILE_NOT_FOUND);
}

CONTRACT(Registry, SizesAreThoseOfTheBytesStored) {
  const CaseKey key;
  // The NT family also stores a NUL that it finds behind the bytes: here none is.
  Expect(Set(key, "v", "C:\\x!", 4), ERROR_SUCCESS);
  DWORD type = 0;
  DWORD size = 99;
  Expect(RegQueryValueExA(key, "V", nullptr, &type, nullptr, &size), ERROR_SUCCESS);
  Expect(type, REG_SZ);
  Expect(size, 4);
  Expect(RegQueryValueExA(key, "v", nullptr, &type, nullptr, nullptr), ERROR_SUCCESS);

  const struct {
    DWORD room;
    LSTATUS status;
  } rows[] = {{0, ERROR_MORE_DATA}, {3, ERROR_MORE_DATA}, {4, ERROR_SUCCESS}, {8, ERROR_SUCCESS}};
  for (const auto& row : rows) {
    char data[8] = {};
    size = row.room;
    Expect(RegQueryValueExA(key, "v", nullptr, nullptr, reinterpret_cast<BYTE*>(data), &size),
           row.status, std::to_string(row.room));
    Expect(size, 4, std::to_string(row.room));
    if (row.status == ERROR_SUCCESS) Expect(std::string(data, 4), "C:\\x");
  }
  BYTE data[8];
  size = sizeof(data);
  Expect(Set(key, "whole", "C:\\x", 5), ERROR_SUCCESS);
  Expect(RegQueryValueExA(key, "whole", nullptr, nullptr, data, &size), ERROR_SUCCESS);
  Expect(size, 5);
  Expect(Set(key, "v", nullptr, 0, REG_EXPAND_SZ), ERROR_SUCCESS);
  Expect(RegQueryValueExA(key, "v", nullptr, &type, data, &size), ERROR_SUCCESS);
  Expect(size, 0);
  Expect(type, REG_EXPAND_SZ);
  size = sizeof(data);
  Expect(Set(key, "raw", "\1\0\2", 3, 3), ERROR_SUCCESS);
  Expect(RegQueryValueExA(key, "raw", nullptr, &type, data, &size), ERROR_SUCCESS);
  Expect(std::string(reinterpret_cast<char*>(data), size), std::string("\1\0\2", 3));
  Expect(RegQueryValueExA(key, "v", nullptr, nullptr, data, nullptr), ERROR_INVALID_PARAMETER);
  Expect(RegQueryValueExA(key, "v", &type, nullptr, data, &size), ERROR_INVALID_PARAMETER);
  Expect(RegQueryValueExA(key, "absent", nullptr, nullptr, data, &size), ERROR_FILE_NOT_FOUND);
  Expect(RegQueryValueExA(key, nullptr, nullptr, nullptr, nullptr, &size), ERROR_FILE_NOT_FOUND);
  Expect(Set(key, nullptr, "default", 8), ERROR_SUCCESS);
  Expect(RegQueryValueExA(key, "", nullptr, nullptr, nullptr, &size), ERROR_SUCCESS);
  Expect(size, 8);
}

CONTRACT(Registry, DefaultValueGetsANulWhereThereIsRoom) {
  const CaseKey key;
  RegCloseKey(Make(key, "none"));
  RegCloseKey(Make(key, "given"));
  const CaseKey given("\\given");
  Expect(Set(given, nullptr, "page!", 4), ERROR_SUCCESS);
  const struct {
    const char* subkey;
    LONG room;
    LSTATUS status;
    LONG size;
    const char* text;
  } rows[] = {
      {"given", 8, ERROR_SUCCESS, 4, "page"},   {"given", 5, ERROR_SUCCESS, 4, "page"},
      {"given", 4, ERROR_SUCCESS, 4, "pagere"}, {"given", 3, ERROR_MORE_DATA, 4, nullptr},
      {"none", 8, ERROR_SUCCESS, 1, ""},        {"absent", 8, ERROR_FILE_NOT_FOUND, 8, nullptr},
  };
  for (const auto& row : rows) {
    const std::string name = row.subkey + std::to_string(row.room);
    char data[8] = "before";
    LONG size = row.room;
    Expect(RegQueryValueA(key, row.subkey, data, &size), row.status, name);
    if (row.status != ERROR_FILE_NOT_FOUND) Expect(size, row.size, name);
    if (row.text != nullptr) Expect(data, row.text, name);
  }
  LONG size = 0;
  Expect(RegQueryValueA(given, nullptr, nullptr, &size), ERROR_SUCCESS);
  Expect(size, 4);
}

CONTRACT(Registry, RightsAreThoseOfTheHandle) {
  RegCloseKey(Make(kMachine, Below("\\B")));
  const CaseKey reader("", KEY_READ);
  const CaseKey writer("", KEY_WRITE);
  char name[8];
  DWORD size = 0;
  Expect(Set(reader, "v", "x", 2), ERROR_ACCESS_DENIED);
  Expect(Set(writer, "v", "x", 2), ERROR_SUCCESS);
  Expect(RegQueryValueExA(writer, "v", nullptr, nullptr, nullptr, &size), ERROR_ACCESS_DENIED);
  Expect(RegEnumKeyA(writer, 0, name, sizeof(name)), ERROR_ACCESS_DENIED);
  Expect(RegDeleteValueA(reader, "v"), ERROR_ACCESS_DENIED);
  Expect(RegQueryValueExA(reader, "v", nullptr, nullptr, nullptr, &size), ERROR_SUCCESS);
  Expect(RegDeleteValueA(writer, "V"), ERROR_SUCCESS);
  Expect(RegDeleteValueA(writer, "v"), ERROR_FILE_NOT_FOUND);
  Expect(RegDeleteKeyA(reader, "B"), ERROR_SUCCESS, "goes by the rights of the key below");
}

CONTRACT(Registry, ListedNamesNeedRoomForTheirNul) {
  const CaseKey key;
  for (const char* name : {"Aa", "Mmmm"}) RegCloseKey(Make(key, name));
  char name[8] = "";
  Expect(RegEnumKeyA(key, 0, name, 3), ERROR_SUCCESS);
  Expect(name, "Aa");
  Expect(RegEnumKeyA(key, 0, name, 2), ERROR_MORE_DATA);
  Expect(RegEnumKeyA(key, 1, name, 4), ERROR_MORE_DATA);
  Expect(RegEnumKeyA(key, 1, name, 5), ERROR_SUCCESS);
  Expect(name, "Mmmm");
  Expect(RegEnumKeyA(key, 2, name, sizeof(name)), ERROR_NO_MORE_ITEMS);
  Expect(RegDeleteKeyA(key, "Aa"), ERROR_SUCCESS);
  Expect(RegEnumKeyA(key, 0, name, sizeof(name)), ERROR_SUCCESS);
  Expect(name, "Mmmm");
}

CONTRACT(Registry, KeyWithSubkeysStays) {
  RegCloseKey(Make(kMachine, Below("\\A\\B\\C")));
  const CaseKey inner("\\A\\B\\C");
  Expect(RegDeleteKeyA(kMachine, nullptr), ERROR_INVALID_PARAMETER);
  Expect(RegDeleteKeyA(kMachine, Below("\\A").c_str()), ERROR_ACCESS_DENIED);
  Expect(Open(inner, ""), ERROR_SUCCESS);
  Expect(RegDeleteKeyA(kMachine, Below("\\A\\B\\c").c_str()), ERROR_SUCCESS);
  Expect(RegDeleteKeyA(kMachine, Below("\\A\\B\\c").c_str()), ERROR_FILE_NOT_FOUND);

  // The handle outlives its key, and a key made anew is another one.
  RegCloseKey(Make(kMachine, Below("\\A\\B\\C")));
  Expect(Set(inner, "v", "x", 2), kErrorKeyDeleted);
  DWORD size = 0;
  Expect(RegQueryValueExA(inner, "v", nullptr, nullptr, nullptr, &size), kErrorKeyDeleted);
}

CONTRACT(Registry, ClosedHandlesAreRefused) {
  const HKEY key = Make(kMachine, contract::kKey);
  Expect(RegCloseKey(key), ERROR_SUCCESS);
  Expect(RegCloseKey(key), ERROR_INVALID_HANDLE);
  Expect(Set(key, "v", "x", 2), ERROR_INVALID_HANDLE);
  Expect(Open(nullptr, "SOFTWARE"), ERROR_INVALID_HANDLE);
  Expect(RegCloseKey(nullptr), ERROR_INVALID_HANDLE);
  Expect(RegCloseKey(kMachine), ERROR_SUCCESS);
}

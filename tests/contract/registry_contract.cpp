// The registry: rights, sizes, and what a key or a value that is not there answers.
#include <algorithm>

#include "tests/contract/contract.h"

namespace contract {
namespace {

constexpr LSTATUS kNotFound = ERROR_FILE_NOT_FOUND;
constexpr LSTATUS kErrorBadPathname = 161, kErrorKeyDeleted = 1018;
constexpr LSTATUS kErrorInvalidHandle = ERROR_INVALID_HANDLE;
const HKEY kMachine = HKEY_LOCAL_MACHINE;

LSTATUS Make(HKEY root, const std::string& path, REGSAM access, HKEY* key, DWORD* made = nullptr) {
  return RegCreateKeyExA(root, path.c_str(), 0, nullptr, 0, access, nullptr, key, made);
}

// A key of the case, made with its parents, closed at its end.
class CaseKey {
 public:
  explicit CaseKey(const std::string& below = "", REGSAM access = KEY_ALL_ACCESS) {
    Expect({Make(kMachine, kKey + below, access, &key_)}, {ERROR_SUCCESS}, below);
  }
  ~CaseKey() { RegCloseKey(key_); }
  CaseKey(const CaseKey&) = delete;
  CaseKey& operator=(const CaseKey&) = delete;
  operator HKEY() const { return key_; }

 private:
  HKEY key_ = nullptr;
};

// Status of an open that is closed again at once.
LSTATUS OpenKey(HKEY parent, const char* path) {
  HKEY key = nullptr;
  const LSTATUS status = RegOpenKeyExA(parent, path, 0, KEY_READ, &key);
  if (status == ERROR_SUCCESS) RegCloseKey(key);
  return status;
}

LSTATUS Set(HKEY key, const char* name, const char* bytes, DWORD size, DWORD type = REG_SZ) {
  return RegSetValueExA(key, name, 0, type, reinterpret_cast<const BYTE*>(bytes), size);
}

// Status; type and size, where they are told; the bytes, a NUL as a full stop.
std::string Query(HKEY key, const char* name, DWORD room = 16) {
  char data[16] = {};
  DWORD type = 0, size = room;
  const LSTATUS status =
      RegQueryValueExA(key, name, nullptr, &type, reinterpret_cast<BYTE*>(data), &size);
  std::string told = std::to_string(status);
  if (status != ERROR_SUCCESS && status != ERROR_MORE_DATA) return told;
  told += " type " + std::to_string(type) + " size " + std::to_string(size);
  if (status != ERROR_SUCCESS) return told;
  std::replace(data, data + size, '\0', '.');
  return told + ' ' + std::string(data, size);
}

// Status, and the name where it is told.
std::string Enumerate(HKEY key, DWORD index, DWORD room = 8) {
  char name[8] = "";
  const LSTATUS status = RegEnumKeyA(key, index, name, room);
  return status == ERROR_SUCCESS ? name : std::to_string(status);
}

}  // namespace

CONTRACT(Registry, PathsAreMadeWholeAndFoundInAnyCase) {
  const std::string path = std::string(kKey) + "\\Made\\Whole";
  for (const DWORD expected : {1u, 2u}) {  // made, opened
    HKEY key = nullptr;
    DWORD made = 0;
    Expect({Make(kMachine, path, KEY_READ, &key, &made), OpenKey(key, ""), RegCloseKey(key), made,
            RegCloseKey(key), Set(key, "v", "x", 2), OpenKey(key, "")},
           {0, 0, 0, expected, kErrorInvalidHandle, kErrorInvalidHandle, kErrorInvalidHandle});
  }
  const CaseKey made;
  Expect({OpenKey(kMachine, "software\\zEB\\CONTRACT\\made"), OpenKey(made, "Made\\Whole\\"),
          OpenKey(made, "made\\\\Whole"), OpenKey(made, ""), OpenKey(kMachine, nullptr),
          RegCloseKey(kMachine), OpenKey(made, "Other"), OpenKey(made, "Other\\Below"),
          OpenKey(made, "\\Made"), OpenKey(nullptr, "SOFTWARE")},
         {0, 0, 0, 0, 0, 0, kNotFound, kNotFound, kErrorBadPathname, kErrorInvalidHandle});
  const char* const inClasses = "SOFTWARE\\Classes\\contract.test";
  HKEY key = nullptr;
  Expect({Make(HKEY_CLASSES_ROOT, "contract.test", KEY_READ, &key), RegCloseKey(key),
          OpenKey(kMachine, inClasses), RegDeleteKeyA(HKEY_CLASSES_ROOT, "contract.test"),
          OpenKey(kMachine, inClasses)},
         {0, 0, 0, 0, kNotFound});
}

CONTRACT(Registry, SizesAreThoseOfTheBytesStored) {
  const CaseKey key;
  // The NT family also stores a NUL that it finds behind the bytes: in the first none is.
  Expect({Query(key, nullptr), Set(key, "v", "C:\\x!", 4), Set(key, "whole", "C:\\x", 5),
          Set(key, "empty", nullptr, 0, REG_EXPAND_SZ), Set(key, "raw", "\1\0\2", 3, 3),
          Set(key, nullptr, "default", 8)},
         {"2", 0, 0, 0, 0, 0});
  Expect({Query(key, "v", 0), Query(key, "v", 3), Query(key, "V", 4), Query(key, "v", 8),
          Query(key, "whole"), Query(key, "empty"), Query(key, "raw"), Query(key, ""),
          Query(key, "absent")},
         {"234 type 1 size 4", "234 type 1 size 4", "0 type 1 size 4 C:\\x",
          "0 type 1 size 4 C:\\x", "0 type 1 size 5 C:\\x.", "0 type 2 size 0 ",
          "0 type 3 size 3 \1.\2", "0 type 1 size 8 default.", "2"});
  BYTE data[8];
  DWORD type = 0, size = 0;
  Expect({RegQueryValueExA(key, "v", nullptr, &type, nullptr, nullptr),
          RegQueryValueExA(key, "v", nullptr, nullptr, nullptr, &size), size,
          RegQueryValueExA(key, "v", nullptr, nullptr, data, nullptr),
          RegQueryValueExA(key, "v", &type, nullptr, data, &size)},
         {0, 0, 4, ERROR_INVALID_PARAMETER, ERROR_INVALID_PARAMETER});
}

CONTRACT(Registry, DefaultValueGetsANulWhereThereIsRoom) {
  const CaseKey key, none("\\none"), given("\\given");
  // Status, size and what is in the buffer.
  const auto told = [&](const char* subkey, LONG room) {
    char data[8] = "before";
    LONG size = room;
    const LSTATUS status = RegQueryValueA(key, subkey, data, &size);
    if (status != ERROR_SUCCESS) data[0] = '\0';
    return std::to_string(status) + ' ' + std::to_string(size) + ' ' + data;
  };
  LONG size = 0;
  Expect({Set(given, nullptr, "page!", 4), told("given", 8), told("given", 5), told("given", 4),
          told("given", 3), told("none", 8), told("absent", 8).substr(0, 2),
          RegQueryValueA(given, nullptr, nullptr, &size), size},
         {0, "0 4 page", "0 4 page", "0 4 pagere", "234 4 ", "0 1 ", "2 ", 0, 4});
}

CONTRACT(Registry, RightsAreThoseOfTheHandle) {
  const CaseKey below("\\B"), reader("", KEY_READ), writer("", KEY_WRITE);
  Expect(
      {Set(writer, "v", "x", 2), Query(writer, "v"), Enumerate(writer, 0), Set(reader, "v", "y", 2),
       RegDeleteValueA(reader, "v"), Query(reader, "v"), RegDeleteValueA(writer, "V"),
       RegDeleteValueA(writer, "v")},
      {0, "5", "5", ERROR_ACCESS_DENIED, ERROR_ACCESS_DENIED, "0 type 1 size 2 x.", 0, kNotFound});
  Expect({RegDeleteKeyA(reader, "B")}, {0}, "goes by the rights of the key below");
}

CONTRACT(Registry, ListedNamesNeedRoomForTheirNul) {
  const CaseKey key, first("\\Aa"), second("\\Mmmm");
  Expect({Enumerate(key, 0, 3), Enumerate(key, 0, 2), Enumerate(key, 1, 4), Enumerate(key, 1, 5),
          Enumerate(key, 2), RegDeleteKeyA(key, "Aa"), Enumerate(key, 0)},
         {"Aa", "234", "234", "Mmmm", "259", 0, "Mmmm"});
}

CONTRACT(Registry, KeyWithSubkeysStays) {
  const CaseKey key, inner("\\A\\B\\C");
  Expect({RegDeleteKeyA(kMachine, nullptr), RegDeleteKeyA(key, "A"), OpenKey(inner, ""),
          RegDeleteKeyA(key, "A\\B\\c"), RegDeleteKeyA(key, "A\\B\\c")},
         {ERROR_INVALID_PARAMETER, ERROR_ACCESS_DENIED, 0, 0, kNotFound});
  // The handle outlives its key, and a key made anew is another one.
  const CaseKey anew("\\A\\B\\C");
  Expect({Set(inner, "v", "x", 2), Query(inner, "v")},
         {kErrorKeyDeleted, std::to_string(kErrorKeyDeleted)});
}

}  // namespace contract

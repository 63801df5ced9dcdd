// The registry: rights, sizes, and what a key or a value that is not there answers.
#include <algorithm>

#include "tests/contract/contract.h"

namespace contract {
namespace {

constexpr LSTATUS kErrorBadPathname = 161;
constexpr LSTATUS kErrorKeyDeleted = 1018;
const HKEY kMachine = HKEY_LOCAL_MACHINE;

// A key of the case, made with its parents, closed at its end.
class CaseKey {
 public:
  explicit CaseKey(const std::string& below = "", REGSAM access = KEY_ALL_ACCESS,
                   HKEY root = kMachine) {
    const std::string path = root == kMachine ? kKey + below : below;
    Expect(RegCreateKeyExA(root, path.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE, access, nullptr,
                           &key_, nullptr),
           ERROR_SUCCESS, path);
  }
  ~CaseKey() { RegCloseKey(key_); }
  CaseKey(const CaseKey&) = delete;
  CaseKey& operator=(const CaseKey&) = delete;
  operator HKEY() const { return key_; }

 private:
  HKEY key_ = nullptr;
};

// Below the case's key.
LSTATUS Delete(const std::string& path) {
  return RegDeleteKeyA(kMachine, (kKey + path).c_str());
}

// Status of an open that is closed again at once.
LSTATUS OpenKey(HKEY parent, const char* path) {
  HKEY key = nullptr;
  const LSTATUS status = RegOpenKeyExA(parent, path, 0, KEY_READ, &key);
  if (status == ERROR_SUCCESS) RegCloseKey(key);
  return status;
}

LSTATUS OpenBelow(const std::string& path) {
  return OpenKey(kMachine, (kKey + path).c_str());
}

LSTATUS Set(HKEY key, const char* name, const char* bytes, DWORD size, DWORD type = REG_SZ) {
  return RegSetValueExA(key, name, 0, type, reinterpret_cast<const BYTE*>(bytes), size);
}

// Status; type and size, where they are told; the bytes, a NUL as a full stop.
std::string Query(HKEY key, const char* name, DWORD room = 16) {
  char data[16] = {};
  DWORD type = 0;
  DWORD size = room;
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
  HKEY key = nullptr;
  for (const DWORD expected : {1u, 2u}) {  // made, opened
    DWORD disposition = 0;
    ExpectEach({RegCreateKeyExA(kMachine, path.c_str(), 0, nullptr, 0, KEY_READ, nullptr, &key,
                                &disposition),
                OpenKey(key, ""), RegCloseKey(key)},
               ERROR_SUCCESS);
    Expect(disposition, expected);
  }
  ExpectEach({OpenKey(kMachine, "software\\zEB\\CONTRACT\\made"), OpenBelow("\\Made\\Whole\\"),
              OpenBelow("\\Made\\\\Whole"), OpenKey(kMachine, ""), OpenKey(kMachine, nullptr)},
             ERROR_SUCCESS);
  ExpectEach({OpenBelow("\\Other"), OpenBelow("\\Other\\Below")}, ERROR_FILE_NOT_FOUND);
  Expect(OpenKey(kMachine, ("\\" + path).c_str()), kErrorBadPathname);
}

CONTRACT(Registry, ClassesAreKeysOfTheMachine) {
  const char* const path = "SOFTWARE\\Classes\\contract.test";
  const CaseKey key("contract.test", KEY_READ, HKEY_CLASSES_ROOT);
  Expect(OpenKey(kMachine, path), ERROR_SUCCESS);
  Expect(RegDeleteKeyA(HKEY_CLASSES_ROOT, "contract.test"), ERROR_SUCCESS);
  Expect(OpenKey(kMachine, path), ERROR_FILE_NOT_FOUND);
}

CONTRACT(Registry, SizesAreThoseOfTheBytesStored) {
  const CaseKey key;
  Expect(Query(key, nullptr), "2");
  // The NT family also stores a NUL that it finds behind the bytes: in the first none is.
  ExpectEach({Set(key, "v", "C:\\x!", 4), Set(key, "whole", "C:\\x", 5),
              Set(key, "empty", nullptr, 0, REG_EXPAND_SZ), Set(key, "raw", "\1\0\2", 3, 3),
              Set(key, nullptr, "default", 8)},
             ERROR_SUCCESS);
  const struct {
    const char* name;
    DWORD room;
    const char* told;
  } rows[] = {{"v", 0, "234 type 1 size 4"},
              {"v", 3, "234 type 1 size 4"},
              {"V", 4, "0 type 1 size 4 C:\\x"},
              {"v", 8, "0 type 1 size 4 C:\\x"},
              {"whole", 8, "0 type 1 size 5 C:\\x."},
              {"empty", 8, "0 type 2 size 0 "},
              {"raw", 8, "0 type 3 size 3 \1.\2"},
              {"", 8, "0 type 1 size 8 default."},
              {"absent", 8, "2"}};
  for (const auto& row : rows) {
    Expect(Query(key, row.name, row.room), row.told, row.name + std::to_string(row.room));
  }
  BYTE data[8];
  DWORD type = 0;
  DWORD size = 0;
  ExpectEach({RegQueryValueExA(key, "v", nullptr, &type, nullptr, nullptr),
              RegQueryValueExA(key, "v", nullptr, nullptr, nullptr, &size)},
             ERROR_SUCCESS);
  Expect(size, 4);
  ExpectEach({RegQueryValueExA(key, "v", nullptr, nullptr, data, nullptr),
              RegQueryValueExA(key, "v", &type, nullptr, data, &size)},
             ERROR_INVALID_PARAMETER);
}

CONTRACT(Registry, DefaultValueGetsANulWhereThereIsRoom) {
  const CaseKey key;
  const CaseKey none("\\none");
  const CaseKey given("\\given");
  Expect(Set(given, nullptr, "page!", 4), ERROR_SUCCESS);
  const struct {
    const char* subkey;
    LONG room;
    LSTATUS status;
    LONG size;
    const char* text;
  } rows[] = {{"given", 8, ERROR_SUCCESS, 4, "page"},   {"given", 5, ERROR_SUCCESS, 4, "page"},
              {"given", 4, ERROR_SUCCESS, 4, "pagere"}, {"given", 3, ERROR_MORE_DATA, 4, nullptr},
              {"none", 8, ERROR_SUCCESS, 1, ""},        {"absent", 8, 2, 0, nullptr}};
  for (const auto& row : rows) {
    const std::string name = row.subkey + std::to_string(row.room);
    char data[8] = "before";
    LONG size = row.room;
    Expect(RegQueryValueA(key, row.subkey, data, &size), row.status, name);
    if (row.size != 0) Expect(size, row.size, name);
    if (row.text != nullptr) Expect(data, row.text, name);
  }
  LONG size = 0;
  Expect(RegQueryValueA(given, nullptr, nullptr, &size), ERROR_SUCCESS);
  Expect(size, 4);
}

CONTRACT(Registry, RightsAreThoseOfTheHandle) {
  const CaseKey below("\\B");
  const CaseKey reader("", KEY_READ);
  const CaseKey writer("", KEY_WRITE);
  ExpectEach({Set(reader, "v", "x", 2), RegDeleteValueA(reader, "v")}, ERROR_ACCESS_DENIED);
  Expect(Set(writer, "v", "x", 2), ERROR_SUCCESS);
  ExpectEach({Query(writer, "v"), Enumerate(writer, 0)}, "5");
  Expect(Query(reader, "v"), "0 type 1 size 2 x.");
  Expect(RegDeleteValueA(writer, "V"), ERROR_SUCCESS);
  Expect(RegDeleteValueA(writer, "v"), ERROR_FILE_NOT_FOUND);
  Expect(RegDeleteKeyA(reader, "B"), ERROR_SUCCESS, "goes by the rights of the key below");
}

CONTRACT(Registry, ListedNamesNeedRoomForTheirNul) {
  const CaseKey key;
  const CaseKey first("\\Aa");
  const CaseKey second("\\Mmmm");
  Expect(Enumerate(key, 0, 3), "Aa");
  ExpectEach({Enumerate(key, 0, 2), Enumerate(key, 1, 4)}, "234");
  Expect(Enumerate(key, 1, 5), "Mmmm");
  Expect(Enumerate(key, 2), "259");
  Expect(Delete("\\Aa"), ERROR_SUCCESS);
  Expect(Enumerate(key, 0), "Mmmm");
}

CONTRACT(Registry, KeyWithSubkeysStays) {
  const CaseKey inner("\\A\\B\\C");
  Expect(RegDeleteKeyA(kMachine, nullptr), ERROR_INVALID_PARAMETER);
  Expect(Delete("\\A"), ERROR_ACCESS_DENIED);
  ExpectEach({OpenKey(inner, ""), Delete("\\A\\B\\c")}, ERROR_SUCCESS);
  Expect(Delete("\\A\\B\\c"), ERROR_FILE_NOT_FOUND);

  // The handle outlives its key, and a key made anew is another one.
  const CaseKey anew("\\A\\B\\C");
  Expect(Set(inner, "v", "x", 2), kErrorKeyDeleted);
  Expect(Query(inner, "v"), std::to_string(kErrorKeyDeleted));
}

CONTRACT(Registry, ClosedHandlesAreRefused) {
  HKEY key = nullptr;
  ExpectEach({RegOpenKeyExA(kMachine, "SOFTWARE", 0, KEY_READ, &key), RegCloseKey(key),
              RegCloseKey(kMachine)},
             ERROR_SUCCESS);
  ExpectEach(
      {RegCloseKey(key), RegCloseKey(nullptr), Set(key, "v", "x", 2), OpenKey(nullptr, "SOFTWARE")},
      ERROR_INVALID_HANDLE);
}

}  // namespace contract

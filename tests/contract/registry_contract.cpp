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
               {ERROR_SUCCESS});
    Expect(disposition, expected);
  }
  const CaseKey made;
  ExpectEach({OpenKey(kMachine, "software\\zEB\\CONTRACT\\made"), OpenKey(made, "Made\\Whole\\"),
              OpenKey(made, "made\\\\Whole"), OpenKey(made, ""), OpenKey(kMachine, nullptr)},
             {ERROR_SUCCESS});
  ExpectEach({OpenKey(made, "Other"), OpenKey(made, "Other\\Below")}, {ERROR_FILE_NOT_FOUND});
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
             {ERROR_SUCCESS});
  ExpectEach({Query(key, "v", 0), Query(key, "v", 3)}, {"234 type 1 size 4"});
  ExpectEach({Query(key, "V", 4), Query(key, "v", 8)}, {"0 type 1 size 4 C:\\x"});
  ExpectEach({Query(key, "whole"), Query(key, "empty"), Query(key, "raw"), Query(key, ""),
              Query(key, "absent")},
             {"0 type 1 size 5 C:\\x.", "0 type 2 size 0 ", "0 type 3 size 3 \1.\2",
              "0 type 1 size 8 default.", "2"});
  BYTE data[8];
  DWORD type = 0;
  DWORD size = 0;
  ExpectEach({RegQueryValueExA(key, "v", nullptr, &type, nullptr, nullptr),
              RegQueryValueExA(key, "v", nullptr, nullptr, nullptr, &size)},
             {ERROR_SUCCESS});
  Expect(size, 4);
  ExpectEach({RegQueryValueExA(key, "v", nullptr, nullptr, data, nullptr),
              RegQueryValueExA(key, "v", &type, nullptr, data, &size)},
             {ERROR_INVALID_PARAMETER});
}

CONTRACT(Registry, DefaultValueGetsANulWhereThereIsRoom) {
  const CaseKey key;
  const CaseKey none("\\none");
  const CaseKey given("\\given");
  Expect(Set(given, nullptr, "page!", 4), ERROR_SUCCESS);
  // Status, size and what is in the buffer.
  const auto told = [&](const char* subkey, LONG room) {
    char data[8] = "before";
    LONG size = room;
    const LSTATUS status = RegQueryValueA(key, subkey, data, &size);
    if (status != ERROR_SUCCESS) data[0] = '\0';
    return std::to_string(status) + ' ' + std::to_string(size) + ' ' + data;
  };
  ExpectEach({told("given", 8), told("given", 5)}, {"0 4 page"});
  ExpectEach({told("given", 4), told("given", 3), told("none", 8)},
             {"0 4 pagere", "234 4 ", "0 1 "});
  Expect(told("absent", 8).substr(0, 2), "2 ");
  LONG size = 0;
  Expect(RegQueryValueA(given, nullptr, nullptr, &size), ERROR_SUCCESS);
  Expect(size, 4);
}

CONTRACT(Registry, RightsAreThoseOfTheHandle) {
  const CaseKey below("\\B");
  const CaseKey reader("", KEY_READ);
  const CaseKey writer("", KEY_WRITE);
  ExpectEach({Set(writer, "v", "x", 2), Query(writer, "v"), Enumerate(writer, 0)}, {0, "5", "5"});
  ExpectEach({Set(reader, "v", "y", 2), RegDeleteValueA(reader, "v")}, {ERROR_ACCESS_DENIED});
  Expect(Query(reader, "v"), "0 type 1 size 2 x.");
  ExpectEach({RegDeleteValueA(writer, "V"), RegDeleteValueA(writer, "v")},
             {ERROR_SUCCESS, ERROR_FILE_NOT_FOUND});
  Expect(RegDeleteKeyA(reader, "B"), ERROR_SUCCESS, "goes by the rights of the key below");
}

CONTRACT(Registry, ListedNamesNeedRoomForTheirNul) {
  const CaseKey key;
  const CaseKey first("\\Aa");
  const CaseKey second("\\Mmmm");
  ExpectEach({Enumerate(key, 0, 3), Enumerate(key, 0, 2), Enumerate(key, 1, 4),
              Enumerate(key, 1, 5), Enumerate(key, 2), RegDeleteKeyA(key, "Aa"), Enumerate(key, 0)},
             {"Aa", "234", "234", "Mmmm", "259", ERROR_SUCCESS, "Mmmm"});
}

CONTRACT(Registry, KeyWithSubkeysStays) {
  const CaseKey key;
  const CaseKey inner("\\A\\B\\C");
  ExpectEach({RegDeleteKeyA(kMachine, nullptr), RegDeleteKeyA(key, "A"), OpenKey(inner, ""),
              RegDeleteKeyA(key, "A\\B\\c"), RegDeleteKeyA(key, "A\\B\\c")},
             {ERROR_INVALID_PARAMETER, ERROR_ACCESS_DENIED, 0, 0, ERROR_FILE_NOT_FOUND});
  // The handle outlives its key, and a key made anew is another one.
  const CaseKey anew("\\A\\B\\C");
  Expect(Set(inner, "v", "x", 2), kErrorKeyDeleted);
  Expect(Query(inner, "v"), std::to_string(kErrorKeyDeleted));
}

CONTRACT(Registry, ClosedHandlesAreRefused) {
  HKEY key = nullptr;
  ExpectEach({RegOpenKeyExA(kMachine, "SOFTWARE", 0, KEY_READ, &key), RegCloseKey(key),
              RegCloseKey(kMachine)},
             {ERROR_SUCCESS});
  ExpectEach(
      {RegCloseKey(key), RegCloseKey(nullptr), Set(key, "v", "x", 2), OpenKey(nullptr, "SOFTWARE")},
      {ERROR_INVALID_HANDLE});
}

}  // namespace contract

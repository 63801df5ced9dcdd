// Files and directories: who may open what, positions, and what is refused.
#include "tests/contract/contract.h"

namespace contract {
namespace {

constexpr DWORD kShareNone = 0;
constexpr DWORD kShareRead = 1;
constexpr DWORD kShareBoth = 3;

int OpenDescriptor(const char* name, int access = _O_RDONLY) {
  return _sopen(name, access | _O_BINARY, _SH_DENYNO);
}

// What is read, or "failed".
std::string Read(HANDLE file, DWORD count) {
  std::string bytes(count, '?');
  DWORD done = 99;
  if (ReadFile(file, bytes.data(), count, &done, nullptr) == FALSE) return "failed";
  bytes.resize(done);
  return bytes;
}

BOOL Write(HANDLE file, const std::string& bytes) {
  DWORD done = 99;
  const BOOL written =
      WriteFile(file, bytes.data(), static_cast<DWORD>(bytes.size()), &done, nullptr);
  Expect(done, written != FALSE ? bytes.size() : 0);
  return written;
}

DWORD Seek(HANDLE file, LONG distance, DWORD method) {
  return SetFilePointer(file, distance, nullptr, method);
}

}  // namespace

CONTRACT(Files, EachOpenerSharesWhatTheOtherDoes) {
  const struct {
    DWORD access, share;    // of the first
    DWORD access2, share2;  // of the second
    bool opens;
  } rows[] = {{GENERIC_READ, kShareNone, GENERIC_READ, kShareBoth, false},
              {GENERIC_READ, kShareBoth, GENERIC_READ, kShareNone, false},
              {GENERIC_READ, kShareRead, GENERIC_READ, kShareRead, true},
              {GENERIC_READ, kShareRead, GENERIC_WRITE, kShareBoth, false},
              {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareRead, false},
              {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareBoth, true}};
  const char* const name = "C:\\contract\\shared";
  WriteText(name, "x");
  for (size_t i = 0; i < std::size(rows); ++i) {
    const HANDLE first = Open(name, rows[i].access, rows[i].share);
    const HANDLE second = Open("c:/CONTRACT/Shared", rows[i].access2, rows[i].share2);
    Expect(Opens(second), rows[i].opens, "row " + std::to_string(i));
    Expect(CloseHandle(first), TRUE);
  }

  // Descriptors let everyone read and write, but not delete.
  const HANDLE exclusive = Open(name, GENERIC_READ);
  ExpectEach({OpenDescriptor(name), _creat(name, kOwnerMayReadAndWrite)}, -1);
  Expect(DeleteFileA(name), FALSE);
  CloseHandle(exclusive);
  const int descriptor = OpenDescriptor(name);
  Expect(Opens(Open(name, GENERIC_READ)), false);
  Expect(Opens(Open(name, GENERIC_READ, kShareBoth)), true);
  ExpectEach({DeleteFileA(name), _close(descriptor)}, 0);
  Expect(DeleteFileA(name), TRUE);
}

CONTRACT(Files, PositionsHaveThirtyTwoBits) {
  const HANDLE file = Create("C:\\contract\\positions");
  Expect(Write(file, "abc"), TRUE);
  ExpectEach({Seek(file, -1, FILE_BEGIN), Seek(file, -4, FILE_CURRENT), Seek(file, 0, 3)},
             INVALID_SET_FILE_POINTER);
  Expect(Seek(file, 0, FILE_CURRENT), 3, "a refused move moves nothing");
  Expect(Seek(file, INT32_MAX, FILE_BEGIN), 0x7FFFFFFF);
  Expect(Seek(file, INT32_MAX, FILE_CURRENT), 0xFFFFFFFE);
  Expect(Seek(file, 1, FILE_CURRENT), INVALID_SET_FILE_POINTER);
  LONG high = 1;
  Expect(SetFilePointer(file, 5, &high, FILE_BEGIN), 5);
  Expect(high, 1);
  Expect(Read(file, 4), "", "far behind the end");
  // Wine gives the lower half.
  if (!IsWine()) {
    Expect(Seek(file, 0, FILE_CURRENT), INVALID_SET_FILE_POINTER, "nowhere for the upper half");
  }
  Expect(Seek(file, 2, FILE_END), 5);
  Expect(GetFileSize(file, nullptr), 3, "a move behind the end adds nothing");
  Expect(Write(file, "z"), TRUE);
  Expect(Seek(file, 1, FILE_BEGIN), 1);
  Expect(Read(file, 100), std::string("bc\0\0z", 5));
  Expect(Read(file, 1), "");
  ExpectEach({Write(file, ""), CloseHandle(file)}, TRUE);
  Expect(CloseHandle(file), FALSE);
  Expect(Read(file, 1), "failed");
  ExpectEach({GetFileSize(file, nullptr), Seek(file, 0, FILE_BEGIN)}, INVALID_FILE_SIZE);
}

CONTRACT(Files, AccessIsWhatWasAskedFor) {
  const char* const name = "C:\\contract\\access";
  WriteText(name, "old");
  const HANDLE reader = Open(name, GENERIC_READ);
  Expect(Write(reader, "x"), FALSE);
  CloseHandle(reader);
  const HANDLE writer = Open(name, GENERIC_WRITE);
  Expect(Read(writer, 1), "failed");
  Expect(Write(writer, "N"), TRUE);
  CloseHandle(writer);
  Expect(ReadText(name), "Nld");
}

CONTRACT(Files, SomeCanBeNeitherOpenedNorMade) {
  WriteText("C:\\contract\\plain", "x");
  CreateDirectoryA("C:\\contract\\folder", nullptr);
  const char* const copy = "C:\\contract\\copy of it";
  for (const char* name :
       {"C:\\contract\\folder", "C:\\contract\\folder\\", "C:\\", "C:", "",
        "C:\\contract\\absent\\x", "C:\\contract\\plain\\x", "C:\\contract\\plain\\",
        "C:\\contract\\new\\", "C:\\contract\\a*b", "C:\\contract\\a?b", "C:\\contract\\a<b",
        "C:\\contract\\a>b", "C:\\contract\\a|b", "C:\\contract\\a\"b", "C:\\contract\\a\tb",
        "Q:\\x"}) {
    ExpectEach({Opens(Open(name, GENERIC_READ)), Opens(Create(name)), DeleteFileA(name),
                CopyFileA("C:\\contract\\plain", name, FALSE), CopyFileA(name, copy, FALSE)},
               FALSE, name);
    ExpectEach({_creat(name, kOwnerMayReadAndWrite), OpenDescriptor(name)}, -1, name);
  }
  ExpectEach({Open("C:\\contract\\absent", GENERIC_WRITE),
              CreateFileA(nullptr, GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr)},
             INVALID_HANDLE_VALUE);
  ExpectEach({GetFileAttributesA("C:\\contract\\absent"), GetFileAttributesA(copy)},
             INVALID_FILE_ATTRIBUTES);
}

CONTRACT(Files, CreateCutsAndKeepsTheNameThatIsThere) {
  WriteText("C:\\contract\\Old.Log", "long text");
  WriteText("C:\\contract\\OLD.log", "new");
  Expect(ReadText("C:\\contract\\old.log"), "new");
}

CONTRACT(Files, ReadOnlyOnesAreNeitherWrittenNorDeleted) {
  const char* const fixed = "C:\\contract\\fixed";
  WriteText(fixed, "kept");
  Expect(_chmod(fixed, _S_IREAD), 0);
  Expect(GetFileAttributesA(fixed), FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY);
  Expect(Opens(Open(fixed, GENERIC_READ)), true);
  Expect(DeleteFileA(fixed), FALSE);
  // Wine leaves the refusal to the host, which refuses root nothing.
  if (!IsWine()) {
    WriteText("C:\\contract\\other", "new");
    ExpectEach({Opens(Open(fixed, GENERIC_WRITE)), Opens(Create(fixed)),
                CopyFileA("C:\\contract\\other", fixed, FALSE)},
               FALSE);
    ExpectEach({_creat(fixed, kOwnerMayReadAndWrite), OpenDescriptor(fixed, _O_WRONLY)}, -1);
  }
  Expect(ReadText(fixed), "kept");
  Expect(Opens(Create("C:\\contract\\made", FILE_ATTRIBUTE_READONLY)), true);
  Expect(DeleteFileA("C:\\contract\\made"), FALSE);
  for (const char* name : {fixed, "C:\\contract\\made"}) {
    Expect(_chmod(name, kOwnerMayReadAndWrite), 0, name);
    Expect(DeleteFileA(name), TRUE, name);
    Expect(DeleteFileA(name), FALSE, name);
  }
}

CONTRACT(Files, CopiesCarryBytesAndAttributes) {
  const char* const from = "C:\\contract\\from";
  const char* const there = "C:\\contract\\to";
  const std::string bytes(200000, 'b');
  WriteText(from, bytes);
  WriteText(there, "something else");
  Expect(CopyFileA(from, there, TRUE), FALSE);
  Expect(ReadText(there), "something else");
  _chmod(from, _S_IREAD);
  for (const char* to : {there, "C:\\contract\\new to"}) {
    Expect(CopyFileA(from, to, FALSE), TRUE, to);
    Expect(ReadText(to) == bytes, true, to);
    // Wine leaves a file that is there its attributes.
    if (!IsWine() || to != there) {
      Expect(GetFileAttributesA(to), FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY, to);
    }
    _chmod(to, kOwnerMayReadAndWrite);
  }
  _chmod(from, kOwnerMayReadAndWrite);

  // The source is opened with sharing, which an exclusive opener of it does not answer.
  const char* const self = "C:\\contract\\self";
  const char* const copy = "C:\\contract\\copy";
  WriteText(self, "whole");
  HANDLE holder = Open(self, GENERIC_READ, kShareRead);
  Expect(CopyFileA(self, copy, FALSE), TRUE);
  Expect(CopyFileA(from, self, FALSE), FALSE, "held target");
  CloseHandle(holder);
  holder = Open(self, GENERIC_READ);
  Expect(CopyFileA(self, copy, FALSE), FALSE);
  CloseHandle(holder);
  ExpectEach({CopyFileA(self, "C:\\contract\\SELF", FALSE),
              CopyFileA("C:\\contract\\absent", copy, FALSE)},
             FALSE);
  Expect(ReadText(self), "whole");
}

CONTRACT(Files, DirectoriesComeOneByOneAndGoEmpty) {
  Expect(CreateDirectoryA("C:\\contract\\A\\b", nullptr), FALSE, "no parent");
  Expect(CreateDirectoryA("C:\\contract\\A", nullptr), TRUE);
  Expect(CreateDirectoryA("C:\\contract\\a", nullptr), FALSE, "there already");
  Expect(CreateDirectoryA("C:\\contract\\a\\b\\", nullptr), TRUE);
  WriteText("C:\\contract\\a\\b\\file", "x");
  for (const char* name : {"C:\\contract\\a\\b\\file", "C:\\contract\\a\\b\\file\\x", "C:\\", "",
                           "Q:\\x", "C:\\contract\\a\\x?y"}) {
    ExpectEach({CreateDirectoryA(name, nullptr), RemoveDirectoryA(name)}, FALSE, name);
  }
  ExpectEach({RemoveDirectoryA("C:\\contract\\a"), RemoveDirectoryA("C:\\contract\\a\\b"),
              RemoveDirectoryA("C:\\contract\\absent"), DeleteFileA("C:\\contract\\a\\b")},
             FALSE);
  ExpectEach({DeleteFileA("C:\\contract\\a\\b\\FILE"), RemoveDirectoryA("C:\\contract\\a\\b"),
              RemoveDirectoryA("C:\\contract\\a\\")},
             TRUE);
  Expect(GetFileAttributesA("C:\\contract\\a"), INVALID_FILE_ATTRIBUTES);
}

}  // namespace contract

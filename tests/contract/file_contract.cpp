// Files and directories: who may open what, positions, and what is refused.
#include "tests/contract/contract.h"

using contract::Expect;
using contract::ReadText;
using contract::WriteText;

namespace {

constexpr DWORD kShareNone = 0;
constexpr DWORD kShareRead = 1;
constexpr DWORD kShareBoth = 3;
constexpr int kOwnerMayReadAndWrite = _S_IREAD | _S_IWRITE;

HANDLE Open(const std::string& name, DWORD access, DWORD share = kShareNone) {
  return CreateFileA(name.c_str(), access, share, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL,
                     nullptr);
}

HANDLE Create(const std::string& name, DWORD attributes = FILE_ATTRIBUTE_NORMAL) {
  return CreateFileA(name.c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                     attributes, nullptr);
}

// Whether the open works; what it opened is closed again.
bool Opens(HANDLE handle) {
  return handle != INVALID_HANDLE_VALUE && CloseHandle(handle) != FALSE;
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
  } rows[] = {
      {GENERIC_READ, kShareNone, GENERIC_READ, kShareBoth, false},
      {GENERIC_READ, kShareBoth, GENERIC_READ, kShareNone, false},
      {GENERIC_READ, kShareRead, GENERIC_READ, kShareRead, true},
      {GENERIC_READ, kShareRead, GENERIC_WRITE, kShareBoth, false},
      {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareRead, false},
      {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareBoth, true},
  };
  WriteText("C:\\contract\\shared", "x");
  for (size_t i = 0; i < std::size(rows); ++i) {
    const HANDLE first = Open("C:\\contract\\shared", rows[i].access, rows[i].share);
    const HANDLE second = Open("c:/CONTRACT/Shared", rows[i].access2, rows[i].share2);
    Expect(Opens(second), rows[i].opens, "row " + std::to_string(i));
    Expect(CloseHandle(first), TRUE);
  }

  // Descriptors let everyone read and write, but not delete.
  const HANDLE exclusive = Open("C:\\contract\\shared", GENERIC_READ);
  Expect(_sopen("C:\\contract\\shared", _O_RDONLY | _O_BINARY, _SH_DENYNO), -1);
  Expect(_creat("C:\\contract\\shared", kOwnerMayReadAndWrite), -1);
  Expect(DeleteFileA("C:\\contract\\shared"), FALSE);
  CloseHandle(exclusive);
  const int descriptor = _sopen("C:\\contract\\shared", _O_RDONLY | _O_BINARY, _SH_DENYNO);
  Expect(Opens(Open("C:\\contract\\shared", GENERIC_READ)), false);
  Expect(Opens(Open("C:\\contract\\shared", GENERIC_READ, kShareBoth)), true);
  Expect(DeleteFileA("C:\\contract\\shared"), FALSE);
  Expect(_close(descriptor), 0);
  Expect(DeleteFileA("C:\\contract\\shared"), TRUE);
}

CONTRACT(Files, PositionsHaveThirtyTwoBits) {
  const HANDLE file = Create("C:\\contract\\positions");
  Expect(Write(file, "abc"), TRUE);
  Expect(Seek(file, -1, FILE_BEGIN), INVALID_SET_FILE_POINTER);
  Expect(Seek(file, -4, FILE_CURRENT), INVALID_SET_FILE_POINTER);
  Expect(Seek(file, 0, 3), INVALID_SET_FILE_POINTER);
  Expect(Seek(file, 0, FILE_CURRENT), 3, "a refused move moves nothing");
  Expect(Seek(file, INT32_MAX, FILE_BEGIN), 0x7FFFFFFF);
  Expect(Seek(file, INT32_MAX, FILE_CURRENT), 0xFFFFFFFE);
  Expect(Seek(file, 1, FILE_CURRENT), INVALID_SET_FILE_POINTER);
  LONG high = 1;
  Expect(SetFilePointer(file, 5, &high, FILE_BEGIN), 5);
  Expect(high, 1);
  Expect(Read(file, 4), "", "far behind the end");
  // Wine gives the lower half.
  if (!contract::IsWine()) {
    Expect(Seek(file, 0, FILE_CURRENT), INVALID_SET_FILE_POINTER, "nowhere for the upper half");
  }
  Expect(Seek(file, 2, FILE_END), 5);
  Expect(GetFileSize(file, nullptr), 3, "a move behind the end adds nothing");
  Expect(Write(file, "z"), TRUE);
  Expect(Seek(file, 1, FILE_BEGIN), 1);
  Expect(Read(file, 100), std::string("bc\0\0z", 5));
  Expect(Read(file, 1), "");
  Expect(Write(file, ""), TRUE);
  Expect(CloseHandle(file), TRUE);
  Expect(CloseHandle(file), FALSE);
  Expect(Read(file, 1), "failed");
  Expect(GetFileSize(file, nullptr), INVALID_FILE_SIZE);
  Expect(Seek(file, 0, FILE_BEGIN), INVALID_SET_FILE_POINTER);
}

CONTRACT(Files, AccessIsWhatWasAskedFor) {
  WriteText("C:\\contract\\access", "old");
  const HANDLE reader = Open("C:\\contract\\access", GENERIC_READ);
  Expect(Write(reader, "x"), FALSE);
  CloseHandle(reader);
  const HANDLE writer = Open("C:\\contract\\access", GENERIC_WRITE);
  Expect(Read(writer, 1), "failed");
  Expect(Write(writer, "N"), TRUE);
  CloseHandle(writer);
  Expect(ReadText("C:\\contract\\access"), "Nld");
}

CONTRACT(Files, SomeCanBeNeitherOpenedNorMade) {
  WriteText("C:\\contract\\plain", "x");
  CreateDirectoryA("C:\\contract\\folder", nullptr);
  for (const char* name :
       {"C:\\contract\\folder", "C:\\contract\\folder\\", "C:\\", "C:", "",
        "C:\\contract\\absent\\x", "C:\\contract\\plain\\x", "C:\\contract\\plain\\",
        "C:\\contract\\new\\", "C:\\contract\\a*b", "C:\\contract\\a?b", "C:\\contract\\a<b",
        "C:\\contract\\a>b", "C:\\contract\\a|b", "C:\\contract\\a\"b", "C:\\contract\\a\tb",
        "Q:\\x"}) {
    Expect(Opens(Open(name, GENERIC_READ)), false, name);
    Expect(Opens(Create(name)), false, name);
    Expect(_creat(name, kOwnerMayReadAndWrite), -1, name);
    Expect(_sopen(name, _O_RDONLY | _O_BINARY, _SH_DENYNO), -1, name);
    Expect(DeleteFileA(name), FALSE, name);
    Expect(CopyFileA("C:\\contract\\plain", name, FALSE), FALSE, name);
    Expect(CopyFileA(name, "C:\\contract\\copy of it", FALSE), FALSE, name);
  }
  Expect(Opens(Open("C:\\contract\\absent", GENERIC_WRITE)), false);
  Expect(CreateFileA(nullptr, GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr),
         INVALID_HANDLE_VALUE);
  Expect(GetFileAttributesA("C:\\contract\\absent"), INVALID_FILE_ATTRIBUTES);
  Expect(GetFileAttributesA("C:\\contract\\copy of it"), INVALID_FILE_ATTRIBUTES);
}

CONTRACT(Files, CreateCutsAndKeepsTheNameThatIsThere) {
  WriteText("C:\\contract\\Old.Log", "long text");
  WriteText("C:\\contract\\OLD.log", "new");
  Expect(ReadText("C:\\contract\\old.log"), "new");
}

CONTRACT(Files, ReadOnlyOnesAreNeitherWrittenNorDeleted) {
  WriteText("C:\\contract\\fixed", "kept");
  Expect(_chmod("C:\\contract\\fixed", _S_IREAD), 0);
  Expect(GetFileAttributesA("C:\\contract\\fixed"),
         FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY);
  Expect(Opens(Open("C:\\contract\\fixed", GENERIC_READ)), true);
  Expect(DeleteFileA("C:\\contract\\fixed"), FALSE);
  // Wine leaves the refusal to the host, which refuses root nothing.
  if (!contract::IsWine()) {
    WriteText("C:\\contract\\other", "new");
    Expect(Opens(Open("C:\\contract\\fixed", GENERIC_WRITE)), false);
    Expect(Opens(Create("C:\\contract\\fixed")), false);
    Expect(CopyFileA("C:\\contract\\other", "C:\\contract\\fixed", FALSE), FALSE);
    Expect(_creat("C:\\contract\\fixed", kOwnerMayReadAndWrite), -1);
    Expect(_sopen("C:\\contract\\fixed", _O_WRONLY | _O_BINARY, _SH_DENYNO), -1);
  }
  Expect(ReadText("C:\\contract\\fixed"), "kept");
  Expect(_chmod("C:\\contract\\fixed", kOwnerMayReadAndWrite), 0);
  Expect(DeleteFileA("C:\\contract\\fixed"), TRUE);

  Expect(Opens(Create("C:\\contract\\made", FILE_ATTRIBUTE_READONLY)), true);
  Expect(DeleteFileA("C:\\contract\\made"), FALSE);
  Expect(_chmod("C:\\contract\\made", kOwnerMayReadAndWrite), 0);
  Expect(DeleteFileA("C:\\contract\\made"), TRUE);
  Expect(DeleteFileA("C:\\contract\\made"), FALSE);
}

CONTRACT(Files, CopiesCarryBytesAndAttributes) {
  const std::string bytes(200000, 'b');
  WriteText("C:\\contract\\from", bytes);
  WriteText("C:\\contract\\to", "something else");
  Expect(CopyFileA("C:\\contract\\from", "C:\\contract\\to", TRUE), FALSE);
  Expect(ReadText("C:\\contract\\to"), "something else");
  _chmod("C:\\contract\\from", _S_IREAD);
  for (const std::string to : {"C:\\contract\\to", "C:\\contract\\new to"}) {
    Expect(CopyFileA("C:\\contract\\from", to.c_str(), FALSE), TRUE, to);
    Expect(ReadText(to) == bytes, true, to);
    // Wine leaves a file that is there its attributes.
    if (contract::IsWine() && to == "C:\\contract\\to") continue;
    Expect(GetFileAttributesA(to.c_str()), FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY, to);
    _chmod(to.c_str(), kOwnerMayReadAndWrite);
  }
  _chmod("C:\\contract\\from", kOwnerMayReadAndWrite);
  _chmod("C:\\contract\\to", kOwnerMayReadAndWrite);

  WriteText("C:\\contract\\self", "whole");
  Expect(CopyFileA("C:\\contract\\self", "C:\\contract\\SELF", FALSE), FALSE);
  Expect(ReadText("C:\\contract\\self"), "whole");
  Expect(CopyFileA("C:\\contract\\absent", "C:\\contract\\copy", FALSE), FALSE);

  // The source is opened with sharing, which an exclusive opener of it does not answer.
  HANDLE holder = Open("C:\\contract\\self", GENERIC_READ, kShareRead);
  Expect(CopyFileA("C:\\contract\\self", "C:\\contract\\copy", FALSE), TRUE);
  Expect(CopyFileA("C:\\contract\\from", "C:\\contract\\self", FALSE), FALSE, "held target");
  CloseHandle(holder);
  holder = Open("C:\\contract\\self", GENERIC_READ);
  Expect(CopyFileA("C:\\contract\\self", "C:\\contract\\copy", FALSE), FALSE);
  CloseHandle(holder);
  Expect(ReadText("C:\\contract\\self"), "whole");
}

CONTRACT(Files, DirectoriesComeOneByOneAndGoEmpty) {
  Expect(CreateDirectoryA("C:\\contract\\A\\b", nullptr), FALSE, "no parent");
  Expect(CreateDirectoryA("C:\\contract\\A", nullptr), TRUE);
  Expect(CreateDirectoryA("C:\\contract\\a", nullptr), FALSE, "there already");
  Expect(CreateDirectoryA("C:\\contract\\a\\b\\", nullptr), TRUE);
  WriteText("C:\\contract\\a\\b\\file", "x");
  for (const char* name : {"C:\\contract\\a\\b\\file", "C:\\contract\\a\\b\\file\\x", "C:\\", "",
                           "Q:\\x", "C:\\contract\\a\\x?y"}) {
    Expect(CreateDirectoryA(name, nullptr), FALSE, name);
    Expect(RemoveDirectoryA(name), FALSE, name);
  }
  Expect(RemoveDirectoryA("C:\\contract\\a"), FALSE);
  Expect(RemoveDirectoryA("C:\\contract\\a\\b"), FALSE);
  Expect(RemoveDirectoryA("C:\\contract\\absent"), FALSE);
  Expect(DeleteFileA("C:\\contract\\a\\b"), FALSE);
  Expect(DeleteFileA("C:\\contract\\a\\b\\FILE"), TRUE);
  Expect(RemoveDirectoryA("C:\\contract\\a\\b"), TRUE);
  Expect(RemoveDirectoryA("C:\\contract\\a\\"), TRUE);
  Expect(GetFileAttributesA("C:\\contract\\a"), INVALID_FILE_ATTRIBUTES);
}

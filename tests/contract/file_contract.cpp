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

DWORD Seek(HANDLE file, LONG distance, DWORD method) {
  return SetFilePointer(file, distance, nullptr, method);
}

}  // namespace

CONTRACT(Files, EachOpenerSharesWhatTheOtherDoes) {
  const char* const name = "C:\\contract\\shared";
  WriteText(name, "x");
  const auto shares = [&](DWORD access, DWORD share, DWORD access2, DWORD share2) {
    const HANDLE first = Open(name, access, share);
    const bool isShared = Opens(Open("c:/CONTRACT/Shared", access2, share2));
    Expect(CloseHandle(first), TRUE);
    return isShared;
  };
  ExpectEach({shares(GENERIC_READ, kShareRead, GENERIC_READ, kShareRead),
              shares(GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareBoth)},
             {true});
  ExpectEach({shares(GENERIC_READ, kShareNone, GENERIC_READ, kShareBoth),
              shares(GENERIC_READ, kShareBoth, GENERIC_READ, kShareNone),
              shares(GENERIC_READ, kShareRead, GENERIC_WRITE, kShareBoth),
              shares(GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareRead)},
             {false});

  // Descriptors let everyone read and write, but not delete.
  const HANDLE exclusive = Open(name, GENERIC_READ);
  ExpectEach({OpenDescriptor(name), _creat(name, kOwnerMayReadAndWrite), DeleteFileA(name),
              CloseHandle(exclusive)},
             {-1, -1, FALSE, TRUE});
  const int descriptor = OpenDescriptor(name);
  ExpectEach({Opens(Open(name, GENERIC_READ)), Opens(Open(name, GENERIC_READ, kShareBoth)),
              DeleteFileA(name), _close(descriptor), DeleteFileA(name)},
             {false, true, FALSE, 0, TRUE});
}

CONTRACT(Files, PositionsHaveThirtyTwoBits) {
  const HANDLE file = Create("C:\\contract\\positions");
  Expect(Write(file, "abc"), TRUE);
  ExpectEach({Seek(file, -1, FILE_BEGIN), Seek(file, -4, FILE_CURRENT), Seek(file, 0, 3)},
             {INVALID_SET_FILE_POINTER});
  // A refused move moves nothing.
  ExpectEach({Seek(file, 0, FILE_CURRENT), Seek(file, INT32_MAX, FILE_BEGIN),
              Seek(file, INT32_MAX, FILE_CURRENT), Seek(file, 1, FILE_CURRENT)},
             {3, 0x7FFFFFFF, 0xFFFFFFFE, INVALID_SET_FILE_POINTER});
  LONG high = 1;
  ExpectEach({SetFilePointer(file, 5, &high, FILE_BEGIN), high, Read(file, 4)}, {5, 1, ""});
  // There is nowhere for the upper half; Wine gives the lower one.
  if (!IsWine()) Expect(Seek(file, 0, FILE_CURRENT), INVALID_SET_FILE_POINTER);
  // A move behind the end adds nothing.
  ExpectEach({Seek(file, 2, FILE_END), GetFileSize(file, nullptr), Write(file, "z"),
              Seek(file, 1, FILE_BEGIN), Read(file, 100), Read(file, 1)},
             {5, 3, TRUE, 1, std::string("bc\0\0z", 5), ""});
  ExpectEach({Write(file, ""), CloseHandle(file)}, {TRUE});
  ExpectEach({CloseHandle(file), Read(file, 1)}, {FALSE, "failed"});
  ExpectEach({GetFileSize(file, nullptr), Seek(file, 0, FILE_BEGIN)}, {INVALID_FILE_SIZE});
}

CONTRACT(Files, OpenGivesTheAccessAskedForAndCreateCuts) {
  const char* const name = "C:\\contract\\Old.Log";
  WriteText(name, "long text");
  WriteText("C:\\contract\\OLD.log", "old");
  const HANDLE reader = Open(name, GENERIC_READ);
  ExpectEach({Write(reader, "x"), CloseHandle(reader)}, {FALSE, TRUE});
  const HANDLE writer = Open(name, GENERIC_WRITE);
  ExpectEach({Read(writer, 1), Write(writer, "N"), CloseHandle(writer)}, {"failed", TRUE, TRUE});
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
               {FALSE}, name);
    ExpectEach({_creat(name, kOwnerMayReadAndWrite), OpenDescriptor(name)}, {-1}, name);
  }
  ExpectEach({Open("C:\\contract\\absent", GENERIC_WRITE),
              CreateFileA(nullptr, GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr)},
             {INVALID_HANDLE_VALUE});
  ExpectEach({GetFileAttributesA("C:\\contract\\absent"), GetFileAttributesA(copy)},
             {INVALID_FILE_ATTRIBUTES});
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
               {FALSE});
    ExpectEach({_creat(fixed, kOwnerMayReadAndWrite), OpenDescriptor(fixed, _O_WRONLY)}, {-1});
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
  ExpectEach({CopyFileA(self, copy, FALSE), CopyFileA(from, self, FALSE), CloseHandle(holder)},
             {TRUE, FALSE, TRUE});
  holder = Open(self, GENERIC_READ);
  ExpectEach({CopyFileA(self, copy, FALSE), CloseHandle(holder)}, {FALSE, TRUE});
  ExpectEach({CopyFileA(self, "C:\\contract\\SELF", FALSE),
              CopyFileA("C:\\contract\\absent", copy, FALSE)},
             {FALSE});
  Expect(ReadText(self), "whole");
}

CONTRACT(Files, DirectoriesComeOneByOneAndGoEmpty) {
  ExpectEach(
      {CreateDirectoryA("C:\\contract\\A\\b", nullptr),
       CreateDirectoryA("C:\\contract\\A", nullptr), CreateDirectoryA("C:\\contract\\a", nullptr),
       CreateDirectoryA("C:\\contract\\a\\b\\", nullptr)},
      {FALSE, TRUE, FALSE, TRUE});
  WriteText("C:\\contract\\a\\b\\file", "x");
  for (const char* name : {"C:\\contract\\a\\b\\file", "C:\\contract\\a\\b\\file\\x", "C:\\", "",
                           "Q:\\x", "C:\\contract\\a\\x?y"}) {
    ExpectEach({CreateDirectoryA(name, nullptr), RemoveDirectoryA(name)}, {FALSE}, name);
  }
  ExpectEach({RemoveDirectoryA("C:\\contract\\a"), RemoveDirectoryA("C:\\contract\\a\\b"),
              RemoveDirectoryA("C:\\contract\\absent"), DeleteFileA("C:\\contract\\a\\b")},
             {FALSE});
  ExpectEach({DeleteFileA("C:\\contract\\a\\b\\FILE"), RemoveDirectoryA("C:\\contract\\a\\b"),
              RemoveDirectoryA("C:\\contract\\a\\")},
             {TRUE});
  Expect(GetFileAttributesA("C:\\contract\\a"), INVALID_FILE_ATTRIBUTES);
}

}  // namespace contract

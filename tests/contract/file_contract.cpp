// Files and directories: who may open what, positions, and what is refused.
#include "tests/contract/contract.h"

namespace contract {
namespace {

int OpenDescriptor(const char* name, int access = _O_RDONLY) {
  return _sopen(name, access | _O_BINARY, _SH_DENYNO);
}

DWORD Seek(HANDLE file, LONG distance, DWORD method) {
  return SetFilePointer(file, distance, nullptr, method);
}

}  // namespace

CONTRACT(Files, EachOpenerSharesWhatTheOtherDoes) {
  const char* const name = "contract/shared";
  WriteText(name, "x");
  const struct {
    DWORD access, share, access2, share2;
    bool isShared;
  } rows[] = {{GENERIC_READ, kShareRead, GENERIC_READ, kShareRead, true},
              {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareBoth, true},
              {GENERIC_READ, 0, GENERIC_READ, kShareBoth, false},
              {GENERIC_READ, kShareBoth, GENERIC_READ, 0, false},
              {GENERIC_READ, kShareRead, GENERIC_WRITE, kShareBoth, false},
              {GENERIC_WRITE, kShareBoth, GENERIC_READ, kShareRead, false}};
  for (const auto& row : rows) {
    const HANDLE first = Open(name, row.access, row.share);
    Expect({Opens(Open("c:/CONTRACT/Shared", row.access2, row.share2)), CloseHandle(first)},
           {row.isShared, TRUE}, std::to_string(&row - rows));
  }
  // To cut a file is to write it, whatever the access asked for; Wine goes by the access alone.
  const HANDLE reader = Open(name, GENERIC_READ, kShareRead);
  if (!IsWine()) {
    Expect({CreateFileA(name, GENERIC_READ, kShareBoth, nullptr, CREATE_ALWAYS, 0, nullptr)},
           {INVALID_HANDLE_VALUE});
  }
  Expect({CloseHandle(reader), ReadText(name)}, {TRUE, "x"});
  // Descriptors let everyone read and write, but not delete.
  const HANDLE exclusive = Open(name);
  Expect(
      {OpenDescriptor(name), _creat(name, kOwnerMayAll), DeleteFileA(name), CloseHandle(exclusive)},
      {-1, -1, FALSE, TRUE});
  const int descriptor = OpenDescriptor(name);
  Expect({Opens(Open(name)), Opens(Open(name, GENERIC_READ, kShareBoth)), DeleteFileA(name),
          _close(descriptor), DeleteFileA(name)},
         {false, true, FALSE, 0, TRUE});
}

CONTRACT(Files, PositionsHaveThirtyTwoBits) {
  const HANDLE file = Create("contract/positions");
  Expect({Write(file, "abc")}, {TRUE});
  Expect({Seek(file, -1, FILE_BEGIN), Seek(file, -4, FILE_CURRENT), Seek(file, 0, 3)},
         {INVALID_SET_FILE_POINTER});
  // A refused move moves nothing.
  LONG high = 1;
  Expect({Seek(file, 0, FILE_CURRENT), Seek(file, INT32_MAX, FILE_BEGIN),
          Seek(file, INT32_MAX, FILE_CURRENT), Seek(file, 1, FILE_CURRENT),
          SetFilePointer(file, 5, &high, FILE_BEGIN), high, Read(file, 4)},
         {3, 0x7FFFFFFF, 0xFFFFFFFE, INVALID_SET_FILE_POINTER, 5, 1, ""});
  // There is nowhere for the upper half; Wine gives the lower one.
  if (!IsWine()) Expect({Seek(file, 0, FILE_CURRENT)}, {INVALID_SET_FILE_POINTER});
  // A move behind the end adds nothing.
  Expect({Seek(file, 2, FILE_END), GetFileSize(file, nullptr), Write(file, "z"),
          Seek(file, 1, FILE_BEGIN), Read(file, 100), Read(file, 1), Write(file, ""),
          CloseHandle(file), CloseHandle(file), Read(file, 1), GetFileSize(file, nullptr),
          Seek(file, 0, FILE_BEGIN)},
         {5, 3, TRUE, 1, std::string("bc\0\0z", 5), "", TRUE, TRUE, FALSE, "failed",
          INVALID_FILE_SIZE, INVALID_SET_FILE_POINTER});
}

CONTRACT(Files, OpenGivesTheAccessAskedForAndCreateCuts) {
  WriteText("contract/Old.Log", "long text");
  WriteText("contract/OLD.log", "old");
  const HANDLE reader = Open("contract/Old.Log");
  Expect({Write(reader, "x"), CloseHandle(reader)}, {FALSE, TRUE});
  const HANDLE writer = Open("contract/Old.Log", GENERIC_WRITE);
  Expect({Read(writer, 1), Write(writer, "N"), CloseHandle(writer), ReadText("contract/Old.Log")},
         {"failed", TRUE, TRUE, "Nld"});
}

CONTRACT(Files, SomeCanBeNeitherOpenedNorMade) {
  WriteText("contract/plain", "x");
  CreateDirectoryA("contract/folder", nullptr);
  for (const char* name :
       {"contract/folder", "contract/folder/", "C:\\", "C:", "", "contract/absent/x",
        "contract/plain/x", "contract\\plain\\", "contract/new/", "contract/a*b", "contract/a?b",
        "contract/a<b", "contract/a>b", "contract/a|b", "contract/a\"b", "contract/a\tb",
        "Q:\\x"}) {
    Expect({Opens(Open(name)), Opens(Create(name)), DeleteFileA(name),
            CopyFileA("contract/plain", name, FALSE), CopyFileA(name, "contract/its copy", FALSE)},
           {FALSE}, name);
    Expect({_creat(name, kOwnerMayAll), OpenDescriptor(name)}, {-1}, name);
  }
  Expect({Open("contract/absent", GENERIC_WRITE),
          CreateFileA(nullptr, GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr)},
         {INVALID_HANDLE_VALUE});
  Expect({GetFileAttributesA("contract/absent"), GetFileAttributesA("contract/its copy")},
         {kAbsent});
}

CONTRACT(Files, ReadOnlyOnesAreNeitherWrittenNorDeleted) {
  const char* const fixed = "contract/fixed";
  const char* const made = "contract/made";
  WriteText(fixed, "kept");
  WriteText("contract/other", "new");
  Expect(
      {_chmod(fixed, _S_IREAD), GetFileAttributesA(fixed), Opens(Open(fixed)), DeleteFileA(fixed)},
      {0, kFixed, true, FALSE});
  // Wine leaves the refusal to the host, which refuses root nothing.
  if (!IsWine()) {
    Expect({Opens(Open(fixed, GENERIC_WRITE)), Opens(Create(fixed)),
            CopyFileA("contract/other", fixed, FALSE)},
           {FALSE});
    Expect({_creat(fixed, kOwnerMayAll), OpenDescriptor(fixed, _O_WRONLY)}, {-1});
  }
  Expect({ReadText(fixed), Opens(Create(made, FILE_ATTRIBUTE_READONLY)), DeleteFileA(made)},
         {"kept", true, FALSE});
  for (const char* name : {fixed, made}) {
    Expect({_chmod(name, kOwnerMayAll), DeleteFileA(name), DeleteFileA(name)}, {0, TRUE, FALSE},
           name);
  }
}

CONTRACT(Files, CopiesCarryBytesAndAttributes) {
  const char* const from = "contract/from";
  const char* const there = "contract/to";
  const std::string bytes(200000, 'b');
  WriteText(from, bytes);
  WriteText(there, "something else");
  Expect({CopyFileA(from, there, TRUE), ReadText(there), _chmod(from, _S_IREAD)},
         {FALSE, "something else", 0});
  for (const char* to : {there, "contract/new to"}) {
    Expect({CopyFileA(from, to, FALSE), ReadText(to) == bytes}, {TRUE}, to);
    // Wine leaves a file that is there its attributes.
    if (!IsWine() || to != there) Expect({GetFileAttributesA(to)}, {kFixed}, to);
    _chmod(to, kOwnerMayAll);
  }
  _chmod(from, kOwnerMayAll);
  // The source is opened with sharing, which an exclusive opener of it does not answer.
  const char* const self = "contract/self";
  const char* const copy = "contract/copy";
  WriteText(self, "whole");
  HANDLE holder = Open(self, GENERIC_READ, kShareRead);
  Expect({CopyFileA(self, copy, FALSE), CopyFileA(from, self, FALSE), CloseHandle(holder)},
         {TRUE, FALSE, TRUE});
  holder = Open(self);
  Expect(
      {CopyFileA(self, copy, FALSE), CloseHandle(holder), CopyFileA(self, "contract/SELF", FALSE),
       CopyFileA("contract/absent", copy, FALSE), ReadText(self)},
      {FALSE, TRUE, FALSE, FALSE, "whole"});
}

CONTRACT(Files, DirectoriesComeOneByOneAndGoEmpty) {
  Expect({CreateDirectoryA("contract/A/b", nullptr), CreateDirectoryA("contract/A", nullptr),
          CreateDirectoryA("contract/a", nullptr), CreateDirectoryA("contract/a/b/", nullptr)},
         {FALSE, TRUE, FALSE, TRUE});
  WriteText("contract/a/b/file", "x");
  for (const char* name :
       {"contract/a/b/file", "contract/a/b/file/x", "C:\\", "", "Q:\\x", "contract/a/x?y"}) {
    Expect({CreateDirectoryA(name, nullptr), RemoveDirectoryA(name)}, {FALSE}, name);
  }
  Expect({RemoveDirectoryA("contract/a"), RemoveDirectoryA("contract/a/b"),
          RemoveDirectoryA("contract/absent"), DeleteFileA("contract/a/b")},
         {FALSE});
  Expect({DeleteFileA("contract/a/b/FILE"), RemoveDirectoryA("contract/a/b"),
          RemoveDirectoryA("contract/a/")},
         {TRUE});
  Expect({GetFileAttributesA("contract/a")}, {kAbsent});
}

}  // namespace contract

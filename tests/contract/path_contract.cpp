// Paths: what names lead to, and how long they may be.
#include <vector>

#include "tests/contract/contract.h"

namespace contract {

CONTRACT(Paths, NamesLeadToTheirFiles) {
  CreateDirectoryA("C:\\contract\\Dir", nullptr);
  WriteText("C:\\contract\\Dir\\Read Me.TXT", "x");
  WriteText("C:\\contract\\caf\xE9", "x");
  const std::pair<DWORD, std::vector<const char*>> rows[] = {
      {FILE_ATTRIBUTE_DIRECTORY,
       {"C:\\contract\\Dir", "C:\\contract\\Dir\\", "C:", "\\contract\\dir",
        "C:\\contract\\absent\\..\\dir", "C:\\..\\..\\contract\\dir", "C:\\contract\\dir. ",
        "C:\\contract\\dir\\.. ", "C:\\contract\\dir\\. . ", "C:contract\\dir", "contract/dir",
        "C:\\contract\\dir\\..", "C:\\contract\\dir\\...", "C:\\contract\\dir\\ "}},
      {FILE_ATTRIBUTE_ARCHIVE,
       {"c:/CONTRACT\\dIR/READ me.txt", "C:\\contract\\CAF\xC9",
        "C:\\contract\\\\Dir\\\\\\read me.txt", "C:\\contract\\Dir\\.\\..\\dir\\read me.txt",
        "C:\\contract\\dir\\Read Me.TXT. ", "C:\\contract\\dir\\Read Me.TXT...",
        "C:\\contract\\dir.\\read me.txt", "C:\\contract\\nul ", "C:\\contract\\nul.", "nul:x",
        "C:nul", "C:\\contract\\nul", "C:\\contract\\NUL.txt", "C:\\contract\\con",
        "C:\\contract\\aux .x", "C:\\contract\\Com1", "C:\\contract\\lpt9:", "nul"}},
      {INVALID_FILE_ATTRIBUTES,
       {"C:\\contract\\cafe",
        "C:\\contract\\dir \\read me.txt",
        "C:\\contract\\dir..\\read me.txt",
        "C:\\contract\\dir. .\\read me.txt",
        "C:\\contract\\...\\dir",
        "C:\\contract\\dir\\. \\read me.txt",
        "C:\\contract\\dir\\.. \\dir",
        "C:\\contract\\dir\\read me.txt \\",
        "C:\\contract\\nul\\",
        " C:\\contract\\dir",
        "C:\\contract\\ dir",
        "C:\\contract\\dir\\read me.txt\\",
        "C:\\contract\\dir\\read me",
        "C:\\contract\\dir\\*",
        "C:\\contract\\dir\\read?me.txt",
        "Q:\\",
        "1:\\dir",
        "\\\\absent\\share\\x",
        "",
        "C:\\contract\\CONSOLE",
        "C:\\contract\\COM0",
        "C:\\contract\\nul\\x"}}};
  for (const auto& [attributes, names] : rows) {
    for (const char* name : names) Expect(GetFileAttributesA(name), attributes, name);
  }
  Expect(GetFileAttributesA("C:\\") & FILE_ATTRIBUTE_DIRECTORY, FILE_ATTRIBUTE_DIRECTORY);
  Expect(GetFileAttributesA(nullptr), INVALID_FILE_ATTRIBUTES);

  // The end of a name falls away when it is made too.
  WriteText("C:\\contract\\end. ", "x");
  Expect(ReadText("C:\\contract\\end"), "x");
  ExpectEach({DeleteFileA("C:\\contract\\END.. "), CreateDirectoryA("C:\\contract\\tail ", nullptr),
              RemoveDirectoryA("C:\\contract\\tail")},
             {TRUE});
}

// Names of devices are no names of files: the null device takes and forgets what is written.
CONTRACT(Paths, NullDeviceIsOpenedForAName) {
  const HANDLE device = Create("C:\\contract\\nul.log");
  Expect(device != INVALID_HANDLE_VALUE, true);
  char byteBack = 0;
  DWORD done = 0;
  Expect(WriteFile(device, "x", 1, &done, nullptr), TRUE);
  Expect(done, 1);
  Expect(ReadFile(device, &byteBack, 1, &done, nullptr), TRUE);
  Expect(done, 0);
  Expect(CloseHandle(device), TRUE);
  // Wine makes a directory of that name.
  if (!IsWine()) Expect(CreateDirectoryA("C:\\contract\\nul", nullptr), FALSE);
  Expect(DeleteFileA("C:\\contract\\nul"), FALSE);
}

CONTRACT(Paths, PathsOf260CharactersAreTooLong) {
  const std::string folder = "C:\\contract\\";
  const auto path = [&](size_t length) {
    return folder + std::string(length - folder.size(), 'p');
  };
  Expect(CreateDirectoryA(path(247).c_str(), nullptr), TRUE);
  Expect(GetFileAttributesA(path(247).c_str()), FILE_ATTRIBUTE_DIRECTORY);
  ExpectEach(
      {RemoveDirectoryA(path(247).c_str()), Opens(Create(path(259))),
       CopyFileA(path(259).c_str(), path(258).c_str(), FALSE), DeleteFileA(path(259).c_str())},
      {TRUE});
  // Wine has no limits of its own.
  if (IsWine()) return;
  ExpectEach({CreateDirectoryA(path(248).c_str(), nullptr), Opens(Create(path(260))),
              CopyFileA(path(258).c_str(), path(260).c_str(), FALSE)},
             {FALSE});
}

}  // namespace contract

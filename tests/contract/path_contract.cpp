// Paths: what names lead to, and how long they may be.
#include <vector>

#include "tests/contract/contract.h"

namespace contract {

CONTRACT(Paths, NamesLeadToTheirFiles) {
  CreateDirectoryA("contract/Dir", nullptr);
  WriteText("contract/Dir/Read Me.TXT", "x");
  WriteText("contract/caf\xE9", "x");
  const std::pair<DWORD, std::vector<const char*>> rows[] = {
      {FILE_ATTRIBUTE_DIRECTORY,
       {"C:\\contract\\Dir", "C:\\contract\\Dir\\", "C:", "\\contract\\dir", "C:contract\\dir",
        "C:\\contract\\absent\\..\\dir", "C:\\..\\..\\contract\\dir", "contract/dir",
        "contract/dir. ", "contract/dir/..", "contract/dir/.. ", "contract/dir/. . ",
        "contract/dir/...", "contract/dir/ "}},
      {kPlain,
       {"c:/CONTRACT\\dIR/READ me.txt", "contract/CAF\xC9", "contract\\\\Dir\\\\\\read me.txt",
        "contract\\Dir\\.\\..\\dir\\read me.txt", "contract/dir/Read Me.TXT. ",
        "contract/dir/Read Me.TXT...", "contract/dir./read me.txt",
        // Names of devices are no names of files.
        "contract/nul ", "contract/nul.", "nul:x", "C:nul", "contract/nul", "contract/NUL.txt",
        "contract/con", "contract/aux .x", "contract/Com1", "contract/lpt9:", "nul"}},
      {kAbsent,
       {"contract/cafe",
        "contract/dir /read me.txt",
        "contract/dir../read me.txt",
        "contract/dir. ./read me.txt",
        "contract/.../dir",
        "contract/dir/. /read me.txt",
        "contract/dir/.. /dir",
        "contract/dir/read me.txt /",
        " C:\\contract\\dir",
        "contract/ dir",
        "contract\\dir\\read me.txt\\",
        "contract/dir/read me",
        "contract/dir/*",
        "contract/dir/read?me.txt",
        "Q:\\",
        "1:\\dir",
        "\\\\absent\\share\\x",
        "",
        "contract/CONSOLE",
        "contract/COM0",
        "contract/nul/",
        "contract/nul/x"}}};
  for (const auto& [attributes, names] : rows) {
    for (const char* name : names) Expect({GetFileAttributesA(name)}, {attributes}, name);
  }
  Expect({GetFileAttributesA("C:\\") & FILE_ATTRIBUTE_DIRECTORY, GetFileAttributesA(nullptr)},
         {FILE_ATTRIBUTE_DIRECTORY, kAbsent});

  // The end of a name falls away when it is made too.
  WriteText("contract/end. ", "x");
  Expect({ReadText("contract/end")}, {"x"});
  Expect({DeleteFileA("contract/END.. "), CreateDirectoryA("contract/tail ", nullptr),
          RemoveDirectoryA("contract/tail")},
         {TRUE});
}

// The null device takes and forgets what is written.
CONTRACT(Paths, NullDeviceIsOpenedForAName) {
  const HANDLE device = Create("contract/nul.log");
  char one = 0;
  DWORD done = 99;
  Expect(
      {WriteFile(device, "x", 1, &done, nullptr), done, ReadFile(device, &one, 1, &done, nullptr),
       done, CloseHandle(device), DeleteFileA("contract/nul")},
      {TRUE, 1, TRUE, 0, TRUE, FALSE});
  // Wine makes a directory of that name.
  if (!IsWine()) Expect({CreateDirectoryA("contract/nul", nullptr)}, {FALSE});
}

CONTRACT(Paths, PathsOf260CharactersAreTooLong) {
  const auto folder = [](size_t length) {
    const std::string path = "C:\\contract\\" + std::string(length - 12, 'p');
    return CreateDirectoryA(path.c_str(), nullptr) != FALSE && RemoveDirectoryA(path.c_str());
  };
  const auto file = [](size_t length, size_t copyLength) {
    const std::string path = "C:\\contract\\" + std::string(length - 12, 'p');
    const std::string copy = "C:\\contract\\" + std::string(copyLength - 12, 'q');
    return Opens(Create(path)) && CopyFileA(path.c_str(), copy.c_str(), FALSE) != FALSE &&
           GetFileAttributesA(copy.c_str()) == kPlain && DeleteFileA(path.c_str());
  };
  Expect({folder(247), file(259, 258), file(258, 259)}, {true});
  // Wine has no limits of its own.
  if (!IsWine()) Expect({folder(248), file(260, 258), file(258, 260)}, {false});
}

}  // namespace contract

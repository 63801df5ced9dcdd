// The runtime's descriptors: what they do differently from the system's handles.
#include <cstdio>

#include "tests/contract/contract.h"

namespace contract {

CONTRACT(Descriptors, TextModeAddsCarriageReturns) {
  const char* const name = "C:\\contract\\text";
  const int made = _creat(name, kOwnerMayReadAndWrite);
  // The bytes added don't count.
  ExpectEach({_write(made, "a\nb\r\n", 5), _tell(made), _setmode(made, _O_BINARY),
              _setmode(made, _O_BINARY), _write(made, "c\n", 2), _write(made, "", 0), _close(made)},
             {5, 7, 0x4000, _O_BINARY, 2, 0, 0});
  Expect(ReadText(name), "a\r\nb\r\r\nc\n");

  const int binary = _sopen(name, _O_WRONLY | _O_BINARY, _SH_DENYNO);
  ExpectEach({_write(binary, "\n", 1), _close(binary)}, {1, 0});
  Expect(ReadText(name), "\n\r\nb\r\r\nc\n", "opening cuts nothing");
}

CONTRACT(Descriptors, MaskWithholdsPermissionsFromANewFile) {
  const char* const name = "C:\\contract\\masked";
  Expect(_umask(kOwnerMayReadAndWrite), 0);
  const int file = _creat(name, kOwnerMayReadAndWrite);
  Expect(_umask(0), kOwnerMayReadAndWrite);
  Expect(GetFileAttributesA(name), FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY);
  char back[8] = {};
  ExpectEach({_setmode(file, _O_BINARY), _write(file, "still", 5), _lseek(file, 0, FILE_BEGIN),
              _read(file, back, sizeof(back))},
             {0x4000, 5, 0, 5});
  Expect(back, "still");
  ExpectEach({_read(file, back, sizeof(back)), _chmod(name, kOwnerMayReadAndWrite)}, {0});
  Expect(GetFileAttributesA(name), FILE_ATTRIBUTE_ARCHIVE);
  Expect(_close(file), 0);
  Expect(_chmod("C:\\contract\\absent", kOwnerMayReadAndWrite), -1);
}

CONTRACT(Descriptors, PositionsAreCutToThirtyTwoBits) {
  const int file = _creat("C:\\contract\\far", kOwnerMayReadAndWrite);
  // A refused move moves nothing.
  ExpectEach({_lseek(file, 10, FILE_BEGIN), _lseek(file, -11, FILE_CURRENT), _lseek(file, 0, 7),
              _tell(file), _lseek(file, 0, FILE_END), _lseek(file, INT32_MAX, FILE_BEGIN),
              _lseek(file, 1, FILE_CURRENT), _tell(file), _close(file)},
             {10, -1, -1, 10, 0, INT32_MAX, INT32_MIN, INT32_MIN, 0});
}

CONTRACT(Descriptors, ClosedAndUnknownOnesAreRefused) {
  const int file = _sopen(kProgram, _O_RDONLY | _O_BINARY, _SH_DENYNO);
  char one = 0;
  ExpectEach({_write(file, "y", 1), _setmode(file, 0)}, {-1}, "opened for reading, no such mode");
  Expect(_close(file), 0);
  for (const int closed : {file, -1, 99}) {
    ExpectEach({_close(closed), _read(closed, &one, 1), _write(closed, &one, 1),
                _lseek(closed, 0, FILE_BEGIN), _tell(closed)},
               {-1}, std::to_string(closed));
  }
}

CONTRACT(Descriptors, StatTellsSizeAndKind) {
  WriteText("C:\\contract\\sized", "12345");
  CreateDirectoryA("C:\\contract\\kind", nullptr);
  WriteText("C:\\contract\\fixed stat", "");
  _chmod("C:\\contract\\fixed stat", _S_IREAD);
  // Kind and permissions, in octal, and size.
  const auto told = [](const char* name) -> std::string {
    struct _stat status = {};
    if (_stat(name, &status) != 0) return "failed";
    char text[32];
    std::snprintf(text, sizeof(text), "%o %d", status.st_mode & 0140600u, int{status.st_size});
    return text;
  };
  ExpectEach({told("C:\\contract\\SIZED"), told("C:\\contract\\fixed stat"),
              told("C:\\contract\\kind"), told("C:\\")},
             {"100600 5", "100400 0", "40600 0", "40600 0"});
  ExpectEach({told("C:\\contract\\kind\\"), told("C:\\contract\\absent"), told("")}, {"failed"});
  _chmod("C:\\contract\\fixed stat", kOwnerMayReadAndWrite);
}

}  // namespace contract

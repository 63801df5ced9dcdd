// The runtime's descriptors: what they do differently from the system's handles.
#include <cstdio>

#include "tests/contract/contract.h"

namespace contract {

constexpr int kTextMode = 0x4000;

CONTRACT(Descriptors, TextModeAddsCarriageReturns) {
  const int made = _creat("contract/text", kOwnerMayAll);
  // The bytes added don't count.
  Expect({_write(made, "a\nb\r\n", 5), _tell(made), _setmode(made, _O_BINARY),
          _setmode(made, _O_BINARY), _write(made, "c\n", 2), _write(made, "", 0), _close(made),
          ReadText("contract/text")},
         {5, 7, kTextMode, _O_BINARY, 2, 0, 0, "a\r\nb\r\r\nc\n"});
  const int binary = _sopen("contract/text", _O_WRONLY | _O_BINARY, _SH_DENYNO);
  const int reader = _sopen("contract/text", _O_RDONLY | _O_BINARY, _SH_DENYNO);
  // Opening cuts nothing.
  Expect({_write(binary, "\n", 1), _write(reader, "x", 1), _close(reader), _close(binary),
          ReadText("contract/text")},
         {1, -1, 0, 0, "\n\r\nb\r\r\nc\n"});
}

CONTRACT(Descriptors, MaskWithholdsPermissionsFromANewFile) {
  const char* const name = "contract/masked";
  char back[8] = {};
  Expect({_umask(kOwnerMayAll)}, {0});
  const int file = _creat(name, kOwnerMayAll);
  Expect({_umask(0), GetFileAttributesA(name), _setmode(file, _O_BINARY), _write(file, "still", 5),
          _lseek(file, 0, FILE_BEGIN), _read(file, back, sizeof(back)), back,
          _read(file, back, sizeof(back)), _chmod(name, kOwnerMayAll), GetFileAttributesA(name),
          _close(file), _chmod("contract/absent", kOwnerMayAll)},
         {kOwnerMayAll, kFixed, kTextMode, 5, 0, 5, "still", 0, 0, kPlain, 0, -1});
}

CONTRACT(Descriptors, PositionsAreCutToThirtyTwoBits) {
  const int file = _creat("contract/far", kOwnerMayAll);
  char one = 0;
  // A refused move moves nothing.
  Expect({_lseek(file, 10, FILE_BEGIN), _lseek(file, -11, FILE_CURRENT), _lseek(file, 0, 7),
          _tell(file), _lseek(file, 0, FILE_END), _lseek(file, INT32_MAX, FILE_BEGIN),
          _lseek(file, 1, FILE_CURRENT), _tell(file), _setmode(file, 0), _close(file)},
         {10, -1, -1, 10, 0, INT32_MAX, INT32_MIN, INT32_MIN, -1, 0});
  for (const int closed : {file, -1, 99}) {
    Expect({_close(closed), _read(closed, &one, 1), _write(closed, &one, 1), _tell(closed)}, {-1});
  }
}

CONTRACT(Descriptors, StatTellsSizeAndKind) {
  WriteText("contract/sized", "12345");
  WriteText("contract/fixed stat", "");
  Expect({CreateDirectoryA("contract/kind", nullptr), _chmod("contract/fixed stat", _S_IREAD)},
         {TRUE, 0});
  // Kind and permissions, in octal, and size.
  const auto told = [](const char* name) -> std::string {
    struct _stat status = {};
    char text[32] = "failed";
    if (_stat(name, &status) == 0) {
      std::snprintf(text, sizeof(text), "%o %d", status.st_mode & 0140600u, int{status.st_size});
    }
    return text;
  };
  Expect({told("contract/SIZED"), told("contract/fixed stat"), told("contract/kind"), told("C:\\")},
         {"100600 5", "100400 0", "40600 0", "40600 0"});
  Expect({told("contract\\kind\\"), told("contract/absent"), told("")}, {"failed"});
  _chmod("contract/fixed stat", kOwnerMayAll);
}

}  // namespace contract

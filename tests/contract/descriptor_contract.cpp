// The runtime's descriptors: what they do differently from the system's handles.
#include "tests/contract/contract.h"

namespace contract {
namespace {

constexpr int kTextMode = 0x4000;
constexpr unsigned kDirectoryBit = 0x4000;
constexpr unsigned kFileBit = 0x8000;

}  // namespace

CONTRACT(Descriptors, TextModeAddsCarriageReturns) {
  const char* const name = "C:\\contract\\text";
  const int made = _creat(name, kOwnerMayReadAndWrite);
  Expect(_write(made, "a\nb\r\n", 5), 5, "the bytes added don't count");
  Expect(_tell(made), 7);
  Expect(_setmode(made, _O_BINARY), kTextMode);
  Expect(_setmode(made, _O_BINARY), _O_BINARY);
  Expect(_write(made, "c\n", 2), 2);
  ExpectEach({_write(made, "", 0), _close(made)}, 0);
  Expect(ReadText(name), "a\r\nb\r\r\nc\n");

  const int binary = _sopen(name, _O_WRONLY | _O_BINARY, _SH_DENYNO);
  Expect(_write(binary, "\n", 1), 1);
  Expect(_close(binary), 0);
  Expect(ReadText(name), "\n\r\nb\r\r\nc\n", "opening cuts nothing");
}

CONTRACT(Descriptors, MaskWithholdsPermissionsFromANewFile) {
  const char* const name = "C:\\contract\\masked";
  Expect(_umask(kOwnerMayReadAndWrite), 0);
  const int file = _creat(name, kOwnerMayReadAndWrite);
  Expect(_umask(0), kOwnerMayReadAndWrite);
  Expect(GetFileAttributesA(name), FILE_ATTRIBUTE_ARCHIVE | FILE_ATTRIBUTE_READONLY);
  Expect(_setmode(file, _O_BINARY), kTextMode);
  Expect(_write(file, "still", 5), 5);
  Expect(_lseek(file, 0, FILE_BEGIN), 0);
  char back[8] = {};
  Expect(_read(file, back, sizeof(back)), 5);
  Expect(back, "still");
  ExpectEach({_read(file, back, sizeof(back)), _chmod(name, kOwnerMayReadAndWrite)}, 0);
  Expect(GetFileAttributesA(name), FILE_ATTRIBUTE_ARCHIVE);
  Expect(_close(file), 0);
  Expect(_chmod("C:\\contract\\absent", kOwnerMayReadAndWrite), -1);
}

CONTRACT(Descriptors, PositionsAreCutToThirtyTwoBits) {
  const int file = _creat("C:\\contract\\far", kOwnerMayReadAndWrite);
  Expect(_lseek(file, 10, FILE_BEGIN), 10);
  ExpectEach({_lseek(file, -11, FILE_CURRENT), _lseek(file, 0, 7)}, -1);
  Expect(_tell(file), 10, "a refused move moves nothing");
  Expect(_lseek(file, 0, FILE_END), 0);
  Expect(_lseek(file, INT32_MAX, FILE_BEGIN), INT32_MAX);
  ExpectEach({_lseek(file, 1, FILE_CURRENT), _tell(file)}, INT32_MIN);
  Expect(_close(file), 0);
}

CONTRACT(Descriptors, ClosedAndUnknownOnesAreRefused) {
  const int file = _sopen(kProgram, _O_RDONLY | _O_BINARY, _SH_DENYNO);
  char one = 0;
  ExpectEach({_write(file, "y", 1), _setmode(file, 0)}, -1, "opened for reading, no such mode");
  Expect(_close(file), 0);
  for (const int closed : {file, -1, 99}) {
    ExpectEach({_close(closed), _read(closed, &one, 1), _write(closed, &one, 1),
                _lseek(closed, 0, FILE_BEGIN), _tell(closed)},
               -1, std::to_string(closed));
  }
}

CONTRACT(Descriptors, StatTellsSizeAndKind) {
  WriteText("C:\\contract\\sized", "12345");
  CreateDirectoryA("C:\\contract\\kind", nullptr);
  WriteText("C:\\contract\\fixed stat", "");
  _chmod("C:\\contract\\fixed stat", _S_IREAD);
  const struct {
    const char* name;
    unsigned mode;  // 0: it fails
    int size;
  } rows[] = {{"C:\\contract\\SIZED", kFileBit | kOwnerMayReadAndWrite, 5},
              {"C:\\contract\\fixed stat", kFileBit | _S_IREAD, 0},
              {"C:\\contract\\kind", kDirectoryBit | kOwnerMayReadAndWrite, 0},
              {"C:\\", kDirectoryBit | kOwnerMayReadAndWrite, 0},
              {"C:\\contract\\kind\\", 0, 0},
              {"C:\\contract\\absent", 0, 0},
              {"", 0, 0}};
  for (const auto& row : rows) {
    struct _stat status = {};
    Expect(_stat(row.name, &status), row.mode != 0 ? 0 : -1, row.name);
    if (row.mode == 0) continue;
    Expect(status.st_mode & (kFileBit | kDirectoryBit | kOwnerMayReadAndWrite), row.mode, row.name);
    Expect(status.st_size, row.size, row.name);
  }
  _chmod("C:\\contract\\fixed stat", kOwnerMayReadAndWrite);
}

}  // namespace contract

// The runtime's descriptors: what they do differently from the system's handles.
#include "tests/contract/contract.h"

using contract::Expect;
using contract::ReadText;
using contract::WriteText;

namespace {

constexpr int kOwnerMayReadAndWrite = _S_IREAD | _S_IWRITE;
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
  Expect(_write(made, "", 0), 0);
  Expect(_close(made), 0);
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
  Expect(_read(file, back, sizeof(back)), 0);
  Expect(_chmod(name, kOwnerMayReadAndWrite), 0);
  Expect(GetFileAttributesA(name), FILE_ATTRIBUTE_ARCHIVE);
  Expect(_close(file), 0);
  Expect(_chmod("C:\\contract\\absent", kOwnerMayReadAndWrite), -1);
}

CONTRACT(Descriptors, PositionsAreCutToThirtyTwoBits) {
  const int file = _creat("C:\\contract\\far", kOwnerMayReadAndWrite);
  Expect(_lseek(file, 10, FILE_BEGIN), 10);
  Expect(_lseek(file, -11, FILE_CURRENT), -1);
  Expect(_lseek(file, 0, 7), -1);
  Expect(_tell(file), 10, "a refused move moves nothing");
  Expect(_lseek(file, 0, FILE_END), 0);
  Expect(_lseek(file, INT32_MAX, FILE_BEGIN), INT32_MAX);
  Expect(_lseek(file, 1, FILE_CURRENT), INT32_MIN);
  Expect(_tell(file), INT32_MIN);
  Expect(_close(file), 0);
}

CONTRACT(Descriptors, ClosedAndUnknownOnesAreRefused) {
  WriteText("C:\\contract\\open", "x");
  const int file = _sopen("C:\\contract\\open", _O_RDONLY | _O_BINARY, _SH_DENYNO);
  char one = 0;
  Expect(_write(file, "y", 1), -1, "opened for reading");
  Expect(_setmode(file, 0), -1);
  Expect(_close(file), 0);
  for (const int closed : {file, -1, 99}) {
    Expect(_close(closed), -1);
    Expect(_read(closed, &one, 1), -1);
    Expect(_write(closed, &one, 1), -1);
    Expect(_lseek(closed, 0, FILE_BEGIN), -1);
    Expect(_tell(closed), -1);
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
  } rows[] = {
      {"C:\\contract\\SIZED", kFileBit | kOwnerMayReadAndWrite, 5},
      {"C:\\contract\\fixed stat", kFileBit | _S_IREAD, 0},
      {"C:\\contract\\kind", kDirectoryBit | kOwnerMayReadAndWrite, 0},
      {"C:\\", kDirectoryBit | kOwnerMayReadAndWrite, 0},
      {"C:\\contract\\kind\\", 0, 0},
      {"C:\\contract\\absent", 0, 0},
      {"", 0, 0},
  };
  for (const auto& row : rows) {
    struct _stat status = {};
    Expect(_stat(row.name, &status), row.mode != 0 ? 0 : -1, row.name);
    constexpr unsigned kTold = kFileBit | kDirectoryBit | kOwnerMayReadAndWrite;
    Expect(row.mode != 0 ? status.st_mode & kTold : 0, row.mode, row.name);
    Expect(row.mode != 0 ? status.st_size : 0, row.size, row.name);
  }
  _chmod("C:\\contract\\fixed stat", kOwnerMayReadAndWrite);
}

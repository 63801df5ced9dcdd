// The program's resources: strings, bitmaps, version data; and the graphics objects that they
// become.
#include <cstring>
#include <vector>

#include "platform/procedure.h"
#include "tests/contract/contract.h"

namespace contract {
namespace {

constexpr UINT kText = 7;  // "Moriv"
constexpr COLORREF kInvalidColor = 0xFFFFFFFF;

struct VersionLibrary {
  HMODULE module = LoadLibraryA("version.dll");
  decltype(&GetFileVersionInfoSizeA) getSize =
      FindProcedure<decltype(getSize)>(module, "GetFileVersionInfoSizeA");
  decltype(&GetFileVersionInfoA) getInfo =
      FindProcedure<decltype(getInfo)>(module, "GetFileVersionInfoA");
  decltype(&VerQueryValueA) query = FindProcedure<decltype(query)>(module, "VerQueryValueA");
  ~VersionLibrary() { FreeLibrary(module); }
};

}  // namespace

CONTRACT(Strings, AreCutToTheBuffer) {
  const HINSTANCE module = GetModuleHandleA(nullptr);
  const struct {
    UINT id;
    int size;
    int length;
    const char* text;
  } rows[] = {{kText, 16, 5, "Moriv"},
              {kText, 6, 5, "Moriv"},
              {kText, 5, 4, "Mori"},
              {kText, 2, 1, "M"},
              {kText, 1, 0, ""},
              {kText, 0, -1, "before"},
              {kText + 1, 16, 0, ""},
              {999, 16, 0, ""},
              {999, 1, 0, ""},
              {65535, 16, 0, ""},
              {0x10000 + kText, 16, 5, "Moriv"}};
  for (const auto& row : rows) {
    const std::string name = std::to_string(row.id) + " in " + std::to_string(row.size);
    char buffer[16] = "before";
    Expect(LoadStringA(module, row.id, buffer, row.size), row.length, name);
    Expect(buffer, row.text, name);
  }
}

CONTRACT(Versions, SizeTellsWhetherThereIsAny) {
  const VersionLibrary version;
  WriteText("C:\\contract\\text file", "MZ");
  DWORD handle = 99;
  char data[64] = {};
  Expect(version.getSize(kProgram, &handle) != 0, true);
  Expect(handle, 0);
  for (const char* name : {"C:\\contract\\text file", "C:\\contract\\absent", "C:\\contract", ""}) {
    ExpectEach({version.getSize(name, &handle), version.getInfo(name, 0, sizeof(data), data)}, 0,
               name);
  }
}

CONTRACT(Versions, PathsNameTheirValues) {
  const VersionLibrary version;
  const DWORD size = version.getSize(kProgram, nullptr);
  std::vector<char> data(size);
  Expect(version.getInfo(kProgram, 0, size, data.data()), TRUE);
  // Those that are not there have the length -1.
  const std::pair<const char*, int> rows[] = {{"\\", 52},
                                              {"\\VarFileInfo\\Translation", 4},
                                              {"\\varFILEinfo\\TRANSLATION", 4},
                                              {"\\StringFileInfo\\040c04b0\\FileVersion", 6},
                                              {"\\stringfileinfo\\040C04B0\\fileversion", 6},
                                              {"StringFileInfo\\040c04b0\\FileVersion", 6},
                                              {"\\StringFileInfo\\040c04b0\\FileVersion\\", 6},
                                              {"\\StringFileInfo\\040c04b0\\FileVersion\\x", -1},
                                              {"\\StringFileInfo\\040c04b0\\Absent", -1},
                                              {"\\StringFileInfo\\040c04b\\FileVersion", -1},
                                              {"\\StringFileInfo\\040904b0\\FileVersion", -1},
                                              {"\\Absent", -1}};
  for (const auto& [path, expected] : rows) {
    void* value = nullptr;
    UINT length = 0;
    const bool isFound = version.query(data.data(), path, &value, &length) != FALSE;
    Expect(isFound ? static_cast<int>(length) : -1, expected, path);
    if (expected == 6) Expect(static_cast<const char*>(value), "4.1.7", path);
    if (expected == 4) Expect(std::memcmp(value, "\x0C\x04\xB0\x04", 4), 0, path);
  }
}

CONTRACT(Graphics, BitmapTellsItsSize) {
  const HINSTANCE module = GetModuleHandleA(nullptr);
  const HBITMAP flag = LoadBitmapA(module, MAKEINTRESOURCEA(120));
  BITMAP size = {};
  Expect(GetObjectA(flag, sizeof(size), &size), sizeof(size));
  Expect(size.bmWidth, 26);
  Expect(size.bmHeight, 15);
  ExpectEach({GetObjectA(flag, sizeof(size) - 1, &size), GetObjectA(nullptr, sizeof(size), &size),
              LoadBitmapA(module, MAKEINTRESOURCEA(999))},
             0);
  Expect(DeleteObject(flag), TRUE);
  ExpectEach({DeleteObject(flag), GetObjectA(flag, sizeof(size), &size)}, 0);
}

CONTRACT(Graphics, ContextHoldsOneObjectOfAKind) {
  const HDC screen = GetDC(nullptr);
  const HDC dc = CreateCompatibleDC(screen);
  const HBRUSH first = CreateSolidBrush(0x112233);
  const HBRUSH second = CreateSolidBrush(0x445566);
  const HFONT font = CreateFontA(14, 0, 0, 0, 400, 1, 1, 0, 0, 0, 0, 0, 0, "");
  const HGDIOBJ stock = SelectObject(dc, first);
  Expect(stock != nullptr, true);
  Expect(SelectObject(dc, second), first);
  ExpectEach({SelectObject(dc, font) != nullptr, DeleteObject(first)}, TRUE);
  Expect(SelectObject(dc, first), nullptr);
  Expect(SelectObject(dc, stock), second);
  Expect(SelectObject(dc, nullptr), nullptr);
  Expect(DeleteObject(second), TRUE);

  Expect(SetTextColor(dc, 0xFF0000), 0);
  Expect(SetTextColor(dc, 0), 0xFF0000);
  Expect(SetBkColor(dc, 0x6400), 0xFFFFFF);
  RECT area = {0, 0, 50, 20};
  ExpectEach(
      {PatBlt(dc, 0, 0, 1, 1, PATCOPY), BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY),
       DrawTextA(dc, "text", 4, &area, DT_VCENTER | DT_SINGLELINE) > 0, DrawFocusRect(dc, &area)},
      TRUE);
  ExpectEach({ReleaseDC(nullptr, screen), DeleteDC(dc), DeleteObject(font)}, TRUE);
  ExpectEach({DeleteDC(dc), SelectObject(dc, stock), PatBlt(dc, 0, 0, 1, 1, PATCOPY),
              BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY),
              DrawTextA(dc, "text", 4, &area, DT_SINGLELINE), DeleteObject(nullptr)},
             0, "of a context that is gone");
  ExpectEach({SetTextColor(dc, 0), SetBkColor(dc, 0)}, kInvalidColor);
  Expect(GetSysColor(COLOR_WINDOW) != GetSysColor(COLOR_HIGHLIGHT), true);
}

}  // namespace contract

// The program's resources: strings, bitmaps, version data; and the graphics objects that they
// become.
#include <cstring>
#include <vector>

#include "platform/procedure.h"
#include "tests/contract/contract.h"

using contract::Expect;

namespace {

constexpr UINT kText = 7;  // "Moriv"
constexpr COLORREF kInvalidColor = 0xFFFFFFFF;
const char* const kProgram = "C:\\contract\\seam_contract.exe";

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
  } rows[] = {
      {kText, 16, 5, "Moriv"},
      {kText, 6, 5, "Moriv"},
      {kText, 5, 4, "Mori"},
      {kText, 2, 1, "M"},
      {kText, 1, 0, ""},
      {kText, 0, -1, "before"},
      {kText + 1, 16, 0, ""},
      {999, 16, 0, ""},
      {999, 1, 0, ""},
      {65535, 16, 0, ""},
      {0x10000 + kText, 16, 5, "Moriv"},
  };
  for (const auto& row : rows) {
    const std::string name = std::to_string(row.id) + " in " + std::to_string(row.size);
    char buffer[16] = "before";
    Expect(LoadStringA(module, row.id, buffer, row.size), row.length, name);
    Expect(buffer, row.text, name);
  }
}

CONTRACT(Versions, SizeTellsWhetherThereIsAny) {
  const VersionLibrary version;
  contract::WriteText("C:\\contract\\text file", "MZ");
  DWORD handle = 99;
  Expect(version.getSize(kProgram, &handle) != 0, true);
  Expect(handle, 0);
  for (const char* name : {"C:\\contract\\text file", "C:\\contract\\absent", "C:\\contract", ""}) {
    Expect(version.getSize(name, &handle), 0, name);
    char data[64] = {};
    Expect(version.getInfo(name, 0, sizeof(data), data), FALSE, name);
  }
}

CONTRACT(Versions, PathsNameTheirValues) {
  const VersionLibrary version;
  const DWORD size = version.getSize(kProgram, nullptr);
  std::vector<char> data(size);
  Expect(version.getInfo(kProgram, 0, size, data.data()), TRUE);
  const struct {
    const char* path;
    BOOL found;
    UINT length;
  } rows[] = {
      {"\\", TRUE, 52},
      {"\\VarFileInfo\\Translation", TRUE, 4},
      {"\\varFILEinfo\\TRANSLATION", TRUE, 4},
      {"\\StringFileInfo\\040c04b0\\FileVersion", TRUE, 6},
      {"\\stringfileinfo\\040C04B0\\fileversion", TRUE, 6},
      {"StringFileInfo\\040c04b0\\FileVersion", TRUE, 6},
      {"\\StringFileInfo\\040c04b0\\FileVersion\\", TRUE, 6},
      {"\\StringFileInfo\\040c04b0\\FileVersion\\x", FALSE, 0},
      {"\\StringFileInfo\\040c04b0\\Absent", FALSE, 0},
      {"\\StringFileInfo\\040c04b\\FileVersion", FALSE, 0},
      {"\\StringFileInfo\\040904b0\\FileVersion", FALSE, 0},
      {"\\Absent", FALSE, 0},
  };
  for (const auto& row : rows) {
    void* value = nullptr;
    UINT length = 0;
    const BOOL found = version.query(data.data(), row.path, &value, &length);
    Expect(found, row.found, row.path);
    if (found == FALSE) continue;
    Expect(length, row.length, row.path);
    if (row.length == 6) Expect(static_cast<const char*>(value), "4.1.7", row.path);
    if (row.length == 4) Expect(std::memcmp(value, "\x0C\x04\xB0\x04", 4), 0, row.path);
  }
}

CONTRACT(Graphics, BitmapTellsItsSize) {
  const HINSTANCE module = GetModuleHandleA(nullptr);
  const HBITMAP flag = LoadBitmapA(module, MAKEINTRESOURCEA(120));
  BITMAP size = {};
  Expect(GetObjectA(flag, sizeof(size) - 1, &size), 0);
  Expect(GetObjectA(flag, sizeof(size), &size), sizeof(size));
  Expect(size.bmWidth, 26);
  Expect(size.bmHeight, 15);
  Expect(GetObjectA(nullptr, sizeof(size), &size), 0);
  Expect(LoadBitmapA(module, MAKEINTRESOURCEA(999)), nullptr);
  Expect(DeleteObject(flag), TRUE);
  Expect(DeleteObject(flag), FALSE);
  Expect(GetObjectA(flag, sizeof(size), &size), 0);
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
  Expect(SelectObject(dc, font) != nullptr, true);
  Expect(DeleteObject(first), TRUE);
  Expect(SelectObject(dc, first), nullptr);
  Expect(SelectObject(dc, stock), second);
  Expect(SelectObject(dc, nullptr), nullptr);
  Expect(DeleteObject(second), TRUE);

  Expect(SetTextColor(dc, 0xFF0000), 0);
  Expect(SetTextColor(dc, 0), 0xFF0000);
  Expect(SetBkColor(dc, 0x6400), 0xFFFFFF);
  RECT area = {0, 0, 50, 20};
  Expect(PatBlt(dc, 0, 0, 1, 1, PATCOPY), TRUE);
  Expect(BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY), TRUE);
  Expect(DrawTextA(dc, "text", 4, &area, DT_VCENTER | DT_SINGLELINE) > 0, true);
  Expect(DrawFocusRect(dc, &area), TRUE);

  Expect(ReleaseDC(nullptr, screen), 1);
  Expect(DeleteDC(dc), TRUE);
  Expect(DeleteDC(dc), FALSE);
  Expect(DeleteObject(font), TRUE, "no longer selected");
  Expect(SelectObject(dc, stock), nullptr);
  Expect(SetTextColor(dc, 0), kInvalidColor);
  Expect(SetBkColor(dc, 0), kInvalidColor);
  Expect(PatBlt(dc, 0, 0, 1, 1, PATCOPY), FALSE);
  Expect(DeleteObject(nullptr), FALSE);
  Expect(GetSysColor(COLOR_WINDOW) != GetSysColor(COLOR_HIGHLIGHT), true);
}

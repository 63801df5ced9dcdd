// The program's resources: strings, bitmaps, version data; and the graphics objects that they
// become.
#include <cstring>
#include <vector>

#include "platform/procedure.h"
#include "tests/contract/contract.h"

namespace contract {
namespace {

constexpr UINT kText = 7;  // "Moriv"

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
  const auto load = [](UINT id, int size) {
    char buffer[16] = "before";
    const int length = LoadStringA(GetModuleHandleA(nullptr), id, buffer, size);
    return std::to_string(length) + ' ' + buffer;
  };
  ExpectEach({load(kText, 16), load(kText, 6), load(0x10000 + kText, 16)}, {"5 Moriv"});
  ExpectEach({load(kText, 5), load(kText, 2), load(kText, 1), load(kText, 0)},
             {"4 Mori", "1 M", "0 ", "-1 before"});
  ExpectEach({load(kText + 1, 16), load(999, 16), load(999, 1), load(65535, 16)}, {"0 "});
}

CONTRACT(Versions, SizeTellsWhetherThereIsAny) {
  const VersionLibrary version;
  WriteText("C:\\contract\\text file", "MZ");
  DWORD handle = 99;
  char data[64] = {};
  ExpectEach({version.getSize(kProgram, &handle) != 0, handle}, {TRUE, 0});
  for (const char* name : {"C:\\contract\\text file", "C:\\contract\\absent", "C:\\contract", ""}) {
    ExpectEach({version.getSize(name, &handle), version.getInfo(name, 0, sizeof(data), data)}, {0},
               name);
  }
}

CONTRACT(Versions, PathsNameTheirValues) {
  const VersionLibrary version;
  std::vector<char> data(version.getSize(kProgram, nullptr));
  Expect(version.getInfo(kProgram, 0, static_cast<DWORD>(data.size()), data.data()), TRUE);
  // Length and text of the value, or "none".
  const auto told = [&](const char* path) {
    void* value = nullptr;
    UINT length = 0;
    if (version.query(data.data(), path, &value, &length) == FALSE) return std::string("none");
    // A text's length counts its NUL.
    return std::to_string(length) + ' ' + std::string(static_cast<char*>(value), length).c_str();
  };
  ExpectEach({told("\\StringFileInfo\\040c04b0\\FileVersion"),
              told("\\stringfileinfo\\040C04B0\\fileversion"),
              told("StringFileInfo\\040c04b0\\FileVersion"),
              told("\\StringFileInfo\\040c04b0\\FileVersion\\")},
             {"6 4.1.7"});
  ExpectEach({told("\\VarFileInfo\\Translation"), told("\\varFILEinfo\\TRANSLATION")},
             {"4 \x0C\x04\xB0\x04"});
  Expect(told("\\").substr(0, 3), "52 ");
  ExpectEach(
      {told("\\StringFileInfo\\040c04b0\\FileVersion\\x"),
       told("\\StringFileInfo\\040c04b0\\Absent"), told("\\StringFileInfo\\040c04b\\FileVersion"),
       told("\\StringFileInfo\\040904b0\\FileVersion"), told("\\Absent")},
      {"none"});
}

CONTRACT(Graphics, BitmapTellsItsSize) {
  const HINSTANCE module = GetModuleHandleA(nullptr);
  const HBITMAP flag = LoadBitmapA(module, MAKEINTRESOURCEA(120));
  BITMAP size = {};
  Expect(GetObjectA(flag, sizeof(size), &size), sizeof(size));
  ExpectEach({size.bmWidth, size.bmHeight}, {26, 15});
  ExpectEach({GetObjectA(flag, sizeof(size) - 1, &size), GetObjectA(nullptr, sizeof(size), &size),
              LoadBitmapA(module, MAKEINTRESOURCEA(999))},
             {0});
  Expect(DeleteObject(flag), TRUE);
  ExpectEach({DeleteObject(flag), GetObjectA(flag, sizeof(size), &size)}, {0});
}

CONTRACT(Graphics, ContextHoldsOneObjectOfAKind) {
  const HDC screen = GetDC(nullptr);
  const HDC dc = CreateCompatibleDC(screen);
  const HBRUSH first = CreateSolidBrush(0x112233);
  const HBRUSH second = CreateSolidBrush(0x445566);
  const HFONT font = CreateFontA(14, 0, 0, 0, 400, 1, 1, 0, 0, 0, 0, 0, 0, "");
  const HGDIOBJ stock = SelectObject(dc, first);
  Expect(stock != nullptr, true);
  ExpectEach({SelectObject(dc, second), SelectObject(dc, font) != nullptr, DeleteObject(first),
              SelectObject(dc, first), SelectObject(dc, stock), SelectObject(dc, nullptr),
              DeleteObject(second)},
             {first, TRUE, TRUE, nullptr, second, nullptr, TRUE});
  ExpectEach({SetTextColor(dc, 0xFF0000), SetTextColor(dc, 0), SetBkColor(dc, 0x6400)},
             {0, 0xFF0000, 0xFFFFFF});
  RECT area = {0, 0, 50, 20};
  ExpectEach(
      {PatBlt(dc, 0, 0, 1, 1, PATCOPY), BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY),
       DrawTextA(dc, "text", 4, &area, DT_VCENTER | DT_SINGLELINE) > 0, DrawFocusRect(dc, &area)},
      {TRUE});
  ExpectEach({ReleaseDC(nullptr, screen), DeleteDC(dc), DeleteObject(font)}, {TRUE});
  ExpectEach({DeleteDC(dc), SelectObject(dc, stock), PatBlt(dc, 0, 0, 1, 1, PATCOPY),
              BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY),
              DrawTextA(dc, "text", 4, &area, DT_SINGLELINE), DeleteObject(nullptr)},
             {0}, "of a context that is gone");
  ExpectEach({SetTextColor(dc, 0), SetBkColor(dc, 0)}, {0xFFFFFFFF});
  Expect(GetSysColor(COLOR_WINDOW) != GetSysColor(COLOR_HIGHLIGHT), true);
}

}  // namespace contract

// The program's resources: strings, bitmaps, version data; and the graphics objects that they
// become.
#include <vector>

#include "platform/procedure.h"
#include "tests/contract/contract.h"

namespace contract {
namespace {

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
  Expect({load(7, 16), load(7, 6), load(0x10007, 16), load(7, 5), load(7, 2), load(7, 1),
          load(8, 16), load(999, 16), load(999, 1), load(65535, 16)},
         {"5 Moriv", "5 Moriv", "5 Moriv", "4 Mori", "1 M", "0 ", "0 ", "0 ", "0 ", "0 "});
}

CONTRACT(Versions, PathsNameTheirValues) {
  const VersionLibrary version;
  DWORD handle = 99;
  char none[64] = {};
  WriteText("contract/text file", "MZ");
  for (const char* name : {"contract/text file", "contract/absent", "contract", ""}) {
    Expect({version.getSize(name, &handle), version.getInfo(name, 0, sizeof(none), none)}, {0},
           name);
  }
  handle = 99;
  std::vector<char> data(version.getSize(kProgram, &handle));
  const auto size = static_cast<DWORD>(data.size());
  Expect({handle, version.getInfo(kProgram, 0, size, data.data())}, {0, TRUE});
  // Length and text of the value, or "none".
  const auto told = [&](const std::string& path) -> std::string {
    void* value = nullptr;
    UINT length = 0;
    if (version.query(data.data(), path.c_str(), &value, &length) == FALSE) return "none";
    // A text's length counts its NUL.
    return std::to_string(length) + ' ' + std::string(static_cast<char*>(value), length).c_str();
  };
  const std::string table = "\\StringFileInfo\\040c04b0\\";
  Expect({told(table + "FileVersion"), told(table + "FileVersion\\"),
          told("\\stringfileinfo\\040C04B0\\fileversion"), told(table.substr(1) + "FileVersion")},
         {"6 4.1.7"});
  Expect({told("\\VarFileInfo\\Translation"), told("\\varFILEinfo\\TRANSLATION")},
         {"4 \x0C\x04\xB0\x04"});
  Expect({told("\\").substr(0, 3)}, {"52 "});
  Expect({told(table + "FileVersion\\x"), told(table + "Absent"), told("\\Absent"),
          told("\\StringFileInfo\\040c04b\\FileVersion"),
          told("\\StringFileInfo\\040904b0\\FileVersion")},
         {"none"});
}

CONTRACT(Graphics, BitmapTellsItsSize) {
  const HINSTANCE module = GetModuleHandleA(nullptr);
  const HBITMAP flag = LoadBitmapA(module, MAKEINTRESOURCEA(120));
  BITMAP size = {};
  Expect({GetObjectA(flag, sizeof(size), &size), size.bmWidth, size.bmHeight,
          GetObjectA(flag, sizeof(size) - 1, &size), GetObjectA(nullptr, sizeof(size), &size),
          LoadBitmapA(module, MAKEINTRESOURCEA(999)), DeleteObject(flag), DeleteObject(flag),
          GetObjectA(flag, sizeof(size), &size)},
         {sizeof(size), 26, 15, 0, 0, nullptr, TRUE, FALSE, 0});
}

CONTRACT(Graphics, ContextHoldsOneObjectOfAKind) {
  const HDC screen = GetDC(nullptr);
  const HDC dc = CreateCompatibleDC(screen);
  const HBRUSH first = CreateSolidBrush(0x112233);
  const HBRUSH second = CreateSolidBrush(0x445566);
  const HFONT font = CreateFontA(14, 0, 0, 0, 400, 1, 1, 0, 0, 0, 0, 0, 0, "");
  const HGDIOBJ stock = SelectObject(dc, first);
  Expect({stock != nullptr, SelectObject(dc, second), SelectObject(dc, font) != nullptr,
          DeleteObject(first), SelectObject(dc, first), SelectObject(dc, stock),
          SelectObject(dc, nullptr), DeleteObject(second)},
         {true, first, true, TRUE, nullptr, second, nullptr, TRUE});
  Expect({SetTextColor(dc, 0xFF0000), SetTextColor(dc, 0), SetBkColor(dc, 0x6400)},
         {0, 0xFF0000, 0xFFFFFF});
  RECT area = {0, 0, 50, 20};
  Expect({PatBlt(dc, 0, 0, 1, 1, PATCOPY), BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY),
          DrawTextA(dc, "text", 4, &area, DT_VCENTER | DT_SINGLELINE) > 0, DrawFocusRect(dc, &area),
          ReleaseDC(nullptr, screen), DeleteDC(dc), DeleteObject(font)},
         {TRUE});
  Expect({DeleteDC(dc), SelectObject(dc, stock), PatBlt(dc, 0, 0, 1, 1, PATCOPY),
          BitBlt(dc, 0, 0, 1, 1, screen, 0, 0, SRCCOPY),
          DrawTextA(dc, "text", 4, &area, DT_SINGLELINE), DeleteObject(nullptr)},
         {0}, "of a context that is gone");
  Expect({SetTextColor(dc, 0), SetBkColor(dc, 0)}, {0xFFFFFFFF});
  Expect({GetSysColor(COLOR_WINDOW) != GetSysColor(COLOR_HIGHLIGHT)}, {true});
}

}  // namespace contract

#include "tools/windows/screen_pixels.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <map>

#include "tools/windows/dialog_view.h"
#include "tools/windows/driven_program.h"

namespace {

struct Pixels {
  int width = 0;
  int height = 0;
  std::vector<DWORD> colors;  // 0x00RRGGBB, row by row from the top

  Pixels Cut(int left, int top, int right, int bottom) const;
};

std::map<int, Pixels> pictures;  // by resource

Pixels Pixels::Cut(int left, int top, int right, int bottom) const {
  Pixels part = {right - left, bottom - top, {}};
  for (int y = top; y < bottom; ++y) {
    const auto row = colors.begin() + y * width;
    part.colors.insert(part.colors.end(), row + left, row + right);
  }
  return part;
}

Pixels Copy(HDC source, RECT area) {
  Pixels pixels = {area.right - area.left, area.bottom - area.top, {}};
  BITMAPINFO info = {};
  info.bmiHeader = {
      sizeof info.bmiHeader, pixels.width, -pixels.height, 1, 32, BI_RGB, 0, 0, 0, 0, 0};
  void* bits = nullptr;
  const HDC dc = CreateCompatibleDC(source);
  const HBITMAP bitmap = CreateDIBSection(dc, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
  SelectObject(dc, bitmap);
  BitBlt(dc, 0, 0, pixels.width, pixels.height, source, area.left, area.top, SRCCOPY);
  GdiFlush();
  const DWORD* const colors = static_cast<const DWORD*>(bits);
  std::transform(colors, colors + pixels.width * pixels.height, std::back_inserter(pixels.colors),
                 [](DWORD color) { return color & 0xFFFFFF; });
  DeleteDC(dc);
  DeleteObject(bitmap);
  return pixels;
}

Pixels OnScreen(HWND window) {
  RECT area = {};
  GetWindowRect(window, &area);
  const HDC screen = GetDC(nullptr);
  Pixels pixels = Copy(screen, area);
  ReleaseDC(nullptr, screen);
  return pixels;
}

// The icon as a control of this size in a box shows it.
Pixels DrawnIcon(LPCSTR icon, RECT area) {
  const HDC screen = GetDC(nullptr);
  const HDC dc = CreateCompatibleDC(screen);
  const HBITMAP bitmap = CreateCompatibleBitmap(screen, area.right, area.bottom);
  SelectObject(dc, bitmap);
  FillRect(dc, &area, GetSysColorBrush(COLOR_BTNFACE));
  DrawIcon(dc, 0, 0, LoadIconA(nullptr, icon));
  Pixels pixels = Copy(dc, area);
  DeleteDC(dc);
  DeleteObject(bitmap);
  ReleaseDC(nullptr, screen);
  return pixels;
}

DWORD Background(const Pixels& pixels) {
  std::map<DWORD, int> counts;
  for (const DWORD color : pixels.colors) ++counts[color];
  return std::ranges::max_element(counts, {}, [](const auto& count) { return count.second; })
      ->first;
}

int Unlikeness(DWORD color, DWORD other) {
  int sum = 0;
  for (const int shift : {0, 8, 16}) {
    sum +=
        std::abs(static_cast<int>(color >> shift & 0xFF) - static_cast<int>(other >> shift & 0xFF));
  }
  return sum;
}

std::string ColorName(DWORD color) {
  const DWORD face = GetSysColor(COLOR_BTNFACE);
  const bool isFace = color == RGB(GetBValue(face), GetGValue(face), GetRValue(face));
  char text[16];
  std::snprintf(text, sizeof text, "%06lX", color);
  return isFace ? "face" : text;
}

std::string SeenColors(const Pixels& pixels) {
  const DWORD background = Background(pixels);
  const DWORD text = *std::ranges::max_element(
      pixels.colors, {}, [background](DWORD color) { return Unlikeness(color, background); });
  return text == background ? "nothing" : ColorName(text) + " on " + ColorName(background);
}

// Whether the picture stands with its corner there.
bool StandsAt(const Pixels& pixels, const Pixels& picture, int x, int y) {
  return pixels.Cut(x, y, x + picture.width, y + picture.height).colors == picture.colors;
}

// What a list shows: colours of the text behind the picture, and the picture.
std::string SeenEntry(const Pixels& pixels) {
  for (const auto& [id, picture] : pictures) {
    for (int y = 0; y + picture.height <= pixels.height; ++y) {
      for (int x = 0; x + picture.width <= pixels.width; ++x) {
        if (!StandsAt(pixels, picture, x, y)) continue;
        const int right =
            pixels.width - GetSystemMetrics(SM_CXVSCROLL) - GetSystemMetrics(SM_CXEDGE);
        const Pixels text = pixels.Cut(x + picture.width + 1, y, right, y + picture.height);
        return SeenColors(text) + " picture " + std::to_string(id);
      }
    }
  }
  return "nothing";
}

std::string Describe(HWND control) {
  const LONG style = GetWindowLongA(control, GWL_STYLE);
  const bool isList = ClassOf(control) == "ComboBox";
  const bool isDrawn = isList
                           ? (style & CBS_OWNERDRAWFIXED) != 0
                           : ClassOf(control) == "Static" && (style & SS_TYPEMASK) == SS_OWNERDRAW;
  if (!isDrawn || !IsShown(control)) return "";
  const Pixels pixels = OnScreen(control);
  const std::string line = "seen " + std::to_string(GetDlgCtrlID(control)) + " ";
  if (!isList) return line + SeenColors(pixels);
  return line + SeenEntry(pixels) + " height " + std::to_string(Ask(control, CB_GETITEMHEIGHT, 0));
}

}  // namespace

void ReadPictures(const char* program) {
  constexpr int kFirst = 120;
  constexpr int kLast = 124;
  const HMODULE file = LoadLibraryExA(program, nullptr, LOAD_LIBRARY_AS_DATAFILE);
  for (int id = kFirst; id <= kLast; ++id) {
    const HANDLE bitmap =
        LoadImageA(file, MAKEINTRESOURCEA(id), IMAGE_BITMAP, 0, 0, LR_CREATEDIBSECTION);
    BITMAP sizes = {};
    if (GetObjectA(bitmap, sizeof sizes, &sizes) == 0) continue;
    const HDC dc = CreateCompatibleDC(nullptr);
    SelectObject(dc, bitmap);
    pictures[id] = Copy(dc, {0, 0, sizes.bmWidth, sizes.bmHeight});
    DeleteDC(dc);
    DeleteObject(bitmap);
  }
  FreeLibrary(file);
}

std::vector<std::string> DescribeDrawn(HWND dialog) {
  LetDraw();
  std::vector<std::string> lines;
  for (const HWND control : ChildrenOf(dialog)) {
    if (std::string line = Describe(control); !line.empty()) lines.push_back(line);
  }
  return lines;
}

std::string SeenIcon(HWND control) {
  const struct {
    LPCSTR icon;
    const char* name;
  } kIcons[] = {{IDI_HAND, "error"},
                {IDI_QUESTION, "question"},
                {IDI_EXCLAMATION, "warning"},
                {IDI_ASTERISK, "information"}};
  LetDraw();
  const Pixels seen = OnScreen(control);
  for (const auto& [icon, name] : kIcons) {
    if (DrawnIcon(icon, {0, 0, seen.width, seen.height}).colors == seen.colors) return name;
  }
  return "unknown";
}

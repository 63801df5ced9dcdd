#include "machine/drawing.h"

#include <cstdio>
#include <cstring>
#include <map>
#include <optional>
#include <utility>

#include "machine/faults.h"
#include "machine/open_objects.h"
#include "machine/own_resource.h"
#include "machine/scripted_user.h"

using machine::CallFails;
using machine::ObjectKind;

namespace {

// The system's colours that differ from PC to PC, as 0x00BBGGRR.
constexpr COLORREF kFaceColor = 0xC8D0D4;  // of a dialog
constexpr COLORREF kHighlightColor = 0x6A240A;

struct GraphicsObject {
  ObjectKind kind = ObjectKind::kBrush;
  std::string description;  // for the record of what was drawn with it
  int resource = 0;         // of a bitmap
  LONG width = 0;           // of a bitmap, in pixels
  LONG height = 0;
  int timesSelected = 0;
};

struct DeviceContext {
  machine::Drawing* record = nullptr;  // null: nobody looks at what is drawn
  std::map<ObjectKind, HGDIOBJ> selected;
  COLORREF textColor = 0;
  COLORREF backgroundColor = 0xFFFFFF;
};

std::map<HGDIOBJ, GraphicsObject> objects;
std::map<HDC, DeviceContext> contexts;
uintptr_t lastObject = 0x20000;

HGDIOBJ NewObject(GraphicsObject object) {
  const HGDIOBJ handle = reinterpret_cast<HGDIOBJ>(lastObject += 4);
  machine::ObjectOpened(object.kind);
  objects[handle] = std::move(object);
  return handle;
}

// What a device context has selected from the start. Nobody owns or deletes these.
HGDIOBJ StockObject(ObjectKind kind) {
  return reinterpret_cast<HGDIOBJ>(static_cast<uintptr_t>(kind) + 1);
}

std::optional<ObjectKind> KindOfStock(HGDIOBJ handle) {
  for (const ObjectKind kind : {ObjectKind::kBrush, ObjectKind::kFont, ObjectKind::kBitmap}) {
    if (handle == StockObject(kind)) return kind;
  }
  return std::nullopt;
}

HDC NewContext() {
  const HDC dc = reinterpret_cast<HDC>(lastObject += 4);
  contexts[dc] = {};
  return dc;
}

DeviceContext* FindContext(HDC dc) {
  const auto found = contexts.find(dc);
  return found != contexts.end() ? &found->second : nullptr;
}

GraphicsObject* FindObject(HGDIOBJ handle) {
  const auto found = objects.find(handle);
  return found != objects.end() ? &found->second : nullptr;
}

void Unselect(DeviceContext* context) {
  for (const auto& [kind, handle] : context->selected) {
    if (GraphicsObject* const object = FindObject(handle)) --object->timesSelected;
  }
}

bool CloseContext(HDC dc) {
  DeviceContext* const context = FindContext(dc);
  if (context == nullptr) return false;
  Unselect(context);
  contexts.erase(dc);
  return true;
}

std::string ColorName(COLORREF color) {
  if (color == kFaceColor) return "face";
  if (color == kHighlightColor) return "highlight";
  char text[16];
  std::snprintf(text, sizeof(text), "%02X%02X%02X", color & 0xFF, color >> 8 & 0xFF,
                color >> 16 & 0xFF);
  return text;
}

// What is selected for a kind; null for none of the program's.
const GraphicsObject* Selected(const DeviceContext& context, ObjectKind kind) {
  const auto found = context.selected.find(kind);
  return found != context.selected.end() ? FindObject(found->second) : nullptr;
}

std::string Describe(const GraphicsObject* object) {
  return object != nullptr ? object->description : "none";
}

std::string Place(LONG x, LONG y, LONG width, LONG height) {
  return std::to_string(x) + "," + std::to_string(y) + " " + std::to_string(width) + "x" +
         std::to_string(height);
}

void Record(DeviceContext* context, const std::string& line) {
  if (context->record != nullptr) context->record->calls.push_back(line);
}

}  // namespace

namespace machine {

HDC BeginDrawing(Drawing* drawing) {
  *drawing = {};
  const HDC dc = NewContext();
  contexts[dc].record = drawing;
  contexts[dc].backgroundColor = kFaceColor;
  return dc;
}

void EndDrawing(HDC dc) {
  CloseContext(dc);
}

std::string DescribeFont(HGDIOBJ font) {
  if (font == nullptr) return "none";
  const GraphicsObject* const object = FindObject(font);
  return object != nullptr ? object->description : "gone";
}

}  // namespace machine

extern "C" {

// The bytes are a BITMAPINFOHEADER: its size, then width and height.
HBITMAP LoadBitmapA(HINSTANCE, LPCSTR id) {
  if (CallFails("LoadBitmapA")) return nullptr;
  constexpr int kBitmapType = 2;
  const int number = static_cast<int>(reinterpret_cast<uintptr_t>(id));
  const auto bytes = machine::OwnResource(kBitmapType, number);
  if (!bytes || bytes->size() < 40) return nullptr;
  GraphicsObject bitmap = {.kind = ObjectKind::kBitmap,
                           .description = "picture " + std::to_string(number),
                           .resource = number};
  std::memcpy(&bitmap.width, bytes->data() + 4, sizeof(bitmap.width));
  std::memcpy(&bitmap.height, bytes->data() + 8, sizeof(bitmap.height));
  if (bitmap.width <= 0 || bitmap.height <= 0) return nullptr;
  return NewObject(bitmap);
}

int GetObjectA(HGDIOBJ handle, int size, LPVOID record) {
  if (CallFails("GetObjectA")) return 0;
  const GraphicsObject* const object = FindObject(handle);
  if (object == nullptr || object->kind != ObjectKind::kBitmap || record == nullptr) return 0;
  if (size < static_cast<int>(sizeof(BITMAP))) return 0;
  BITMAP bitmap = {};
  bitmap.bmWidth = object->width;
  bitmap.bmHeight = object->height;
  bitmap.bmPlanes = 1;
  bitmap.bmBitsPixel = 32;  // of the screen
  bitmap.bmWidthBytes = object->width * 4;
  std::memcpy(record, &bitmap, sizeof(bitmap));
  return sizeof(bitmap);
}

// What a font of this program has no need of shows only that it is there.
HFONT CreateFontA(int height, int width, int escapement, int orientation, int weight, DWORD italic,
                  DWORD underline, DWORD strikeOut, DWORD charSet, DWORD outPrecision,
                  DWORD clipPrecision, DWORD quality, DWORD pitch, LPCSTR face) {
  if (CallFails("CreateFontA")) return nullptr;
  const bool hasMore = (width | escapement | orientation) != 0 ||
                       (strikeOut | charSet | outPrecision | clipPrecision | quality | pitch) != 0;
  return NewObject(
      {.kind = ObjectKind::kFont,
       .description = machine::Quoted(face != nullptr ? face : "") + " " + std::to_string(height) +
                      " " + std::to_string(weight) + (italic != 0 ? " italic" : "") +
                      (underline != 0 ? " underlined" : "") + (hasMore ? " and more" : "")});
}

HBRUSH CreateSolidBrush(COLORREF color) {
  if (CallFails("CreateSolidBrush")) return nullptr;
  return NewObject({.kind = ObjectKind::kBrush, .description = ColorName(color)});
}

// An object that is selected somewhere can't be deleted.
BOOL DeleteObject(HGDIOBJ handle) {
  const bool fails = CallFails("DeleteObject");
  const GraphicsObject* const object = FindObject(handle);
  if (object == nullptr || object->timesSelected > 0) return FALSE;
  machine::ObjectClosed(object->kind);
  objects.erase(handle);
  return !fails;
}

HDC GetDC(HWND) {
  if (CallFails("GetDC")) return nullptr;
  machine::ObjectOpened(ObjectKind::kDeviceContext);
  return NewContext();
}

int ReleaseDC(HWND, HDC dc) {
  const bool fails = CallFails("ReleaseDC");
  if (!CloseContext(dc)) return 0;
  machine::ObjectClosed(ObjectKind::kDeviceContext);
  return fails ? 0 : 1;
}

HDC CreateCompatibleDC(HDC) {
  if (CallFails("CreateCompatibleDC")) return nullptr;
  machine::ObjectOpened(ObjectKind::kDeviceContext);
  return NewContext();
}

BOOL DeleteDC(HDC dc) {
  const bool fails = CallFails("DeleteDC");
  if (!CloseContext(dc)) return FALSE;
  machine::ObjectClosed(ObjectKind::kDeviceContext);
  return !fails;
}

HGDIOBJ SelectObject(HDC dc, HGDIOBJ handle) {
  if (CallFails("SelectObject")) return nullptr;
  DeviceContext* const context = FindContext(dc);
  if (context == nullptr) return nullptr;
  GraphicsObject* const object = FindObject(handle);
  const std::optional<ObjectKind> kind = object != nullptr ? object->kind : KindOfStock(handle);
  if (!kind) return nullptr;
  const auto found = context->selected.find(*kind);
  const HGDIOBJ previous = found != context->selected.end() ? found->second : StockObject(*kind);
  if (GraphicsObject* const old = FindObject(previous)) --old->timesSelected;
  if (object != nullptr) ++object->timesSelected;
  context->selected[*kind] = handle;
  return previous;
}

DWORD GetSysColor(int index) {
  if (CallFails("GetSysColor")) return 0;
  switch (index) {
    case COLOR_WINDOW:
    case COLOR_HIGHLIGHTTEXT:
      return 0xFFFFFF;
    case COLOR_HIGHLIGHT:
      return kHighlightColor;
    default:
      return 0;
  }
}

COLORREF SetTextColor(HDC dc, COLORREF color) {
  DeviceContext* const context = FindContext(dc);
  if (CallFails("SetTextColor") || context == nullptr) return 0xFFFFFFFF;
  return std::exchange(context->textColor, color);
}

COLORREF SetBkColor(HDC dc, COLORREF color) {
  DeviceContext* const context = FindContext(dc);
  if (CallFails("SetBkColor") || context == nullptr) return 0xFFFFFFFF;
  return std::exchange(context->backgroundColor, color);
}

BOOL PatBlt(HDC dc, int x, int y, int width, int height, DWORD) {
  DeviceContext* const context = FindContext(dc);
  if (CallFails("PatBlt") || context == nullptr) return FALSE;
  Record(context, "fill " + Place(x, y, width, height) + " " +
                      Describe(Selected(*context, ObjectKind::kBrush)));
  return TRUE;
}

BOOL BitBlt(HDC dc, int x, int y, int width, int height, HDC source, int, int, DWORD) {
  DeviceContext* const context = FindContext(dc);
  const DeviceContext* const from = FindContext(source);
  if (CallFails("BitBlt") || context == nullptr || from == nullptr) return FALSE;
  const GraphicsObject* const bitmap = Selected(*from, ObjectKind::kBitmap);
  Record(context, Describe(bitmap) + " " + Place(x, y, width, height));
  if (context->record != nullptr && bitmap != nullptr) context->record->picture = bitmap->resource;
  return TRUE;
}

int DrawTextA(HDC dc, LPCSTR text, int length, LPRECT rectangle, UINT format) {
  DeviceContext* const context = FindContext(dc);
  if (CallFails("DrawTextA") || context == nullptr || text == nullptr || rectangle == nullptr)
    return 0;
  const std::string bytes =
      length < 0 ? std::string(text) : std::string(text, static_cast<size_t>(length));
  const std::string colors =
      ColorName(context->textColor) + " on " + ColorName(context->backgroundColor);
  Record(context, "text " + machine::Quoted(bytes) + " " + std::to_string(rectangle->left) + "," +
                      std::to_string(rectangle->top) + " format " + std::to_string(format) + " " +
                      colors);
  if (context->record != nullptr) context->record->colors = colors;
  return rectangle->bottom - rectangle->top;
}

BOOL DrawFocusRect(HDC dc, const RECT*) {
  DeviceContext* const context = FindContext(dc);
  if (CallFails("DrawFocusRect") || context == nullptr) return FALSE;
  Record(context, "focus");
  return TRUE;
}

}  // extern "C"

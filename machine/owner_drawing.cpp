#include "machine/owner_drawing.h"

#include "machine/drawing.h"

namespace machine {
namespace {

constexpr UINT kStaticType = 5;        // ODT_STATIC
constexpr UINT kDrawEntire = 1;        // ODA_DRAWENTIRE
constexpr UINT kDisabledState = 4;     // ODS_DISABLED
constexpr UINT kUsualItemHeight = 16;  // pixels, of a line of the dialog's font
constexpr UINT kFieldState = 0x1000;   // ODS_COMBOBOXEDIT: the field, no entry of the open list

// The field of a list shows the selected entry; without one its number is -1 and it has no data.
void DescribeField(const Window& list, DRAWITEMSTRUCT* item) {
  item->CtlType = ODT_COMBOBOX;
  item->itemID = static_cast<UINT>(list.selection);
  item->itemState |= kFieldState;
  if (OpenDialog()->focus == list.handle) item->itemState |= ODS_SELECTED | ODS_FOCUS;
  if (list.selection >= 0) item->itemData = list.items[static_cast<size_t>(list.selection)];
  item->rcItem.bottom = static_cast<LONG>(list.itemHeight);
}

// An entry of the open list.
void DescribeEntry(const Window& list, int entry, DRAWITEMSTRUCT* item) {
  item->CtlType = ODT_COMBOBOX;
  item->itemID = static_cast<UINT>(entry);
  if (entry == list.selection) item->itemState |= ODS_SELECTED | ODS_FOCUS;
  item->itemData = list.items[static_cast<size_t>(entry)];
  item->rcItem.top = static_cast<LONG>(list.itemHeight) * entry;
  item->rcItem.bottom = item->rcItem.top + static_cast<LONG>(list.itemHeight);
}

DRAWITEMSTRUCT DescribeControl(const Window& control) {
  DRAWITEMSTRUCT item = {};
  item.CtlType = kStaticType;
  item.CtlID = static_cast<UINT>(control.id);
  item.itemAction = kDrawEntire;
  item.itemState = control.IsEnabled() ? 0 : kDisabledState;
  item.hwndItem = control.handle;
  item.rcItem = {0, 0, control.width, control.height};
  return item;
}

void Draw(DRAWITEMSTRUCT item, Drawing* drawing) {
  item.hDC = BeginDrawing(drawing);
  SendToDialog(WM_DRAWITEM, item.CtlID, reinterpret_cast<LPARAM>(&item));
  EndDrawing(item.hDC);
}

void DrawControl(Window* control) {
  control->needsDrawing = false;
  DRAWITEMSTRUCT item = DescribeControl(*control);
  if (control->kind == WindowKind::kComboBox) DescribeField(*control, &item);
  Draw(item, &control->drawing);
}

}  // namespace

void MeasureItems(Window* control) {
  if (control->kind != WindowKind::kComboBox || !control->IsOwnerDrawn()) return;
  MEASUREITEMSTRUCT measure = {};
  measure.CtlType = ODT_COMBOBOX;
  measure.CtlID = static_cast<UINT>(control->id);
  measure.itemHeight = kUsualItemHeight;
  SendToDialog(WM_MEASUREITEM, measure.CtlID, reinterpret_cast<LPARAM>(&measure));
  control->itemHeight = measure.itemHeight;
}

void DrawControls() {
  for (size_t index = 0; index < OpenDialog()->controls.size(); ++index) {
    Window* const control = OpenDialog()->controls[index].get();
    if (control->needsDrawing && control->IsShown() && control->IsOwnerDrawn()) {
      DrawControl(control);
    }
  }
}

std::vector<Drawing> DrawEntries(const Window& list) {
  std::vector<Drawing> drawings(list.items.size());
  for (size_t entry = 0; entry < drawings.size(); ++entry) {
    DRAWITEMSTRUCT item = DescribeControl(list);
    DescribeEntry(list, static_cast<int>(entry), &item);
    Draw(item, &drawings[entry]);
  }
  return drawings;
}

void DeleteItems(const Window& control) {
  for (size_t index = control.items.size(); index-- > 0;) {
    DELETEITEMSTRUCT deleted = {};
    deleted.CtlType = ODT_COMBOBOX;
    deleted.CtlID = static_cast<UINT>(control.id);
    deleted.itemID = static_cast<UINT>(index);
    deleted.hwndItem = control.handle;
    deleted.itemData = control.items[index];
    SendToDialog(WM_DELETEITEM, deleted.CtlID, reinterpret_cast<LPARAM>(&deleted));
  }
}

}  // namespace machine

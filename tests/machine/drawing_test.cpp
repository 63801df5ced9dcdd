// The graphics objects of the stand-in machine, and the controls that a program draws itself.
#include "machine/drawing.h"

#include "machine/open_objects.h"
#include "tests/support/test_dialog.h"

namespace {

class Drawing : public DialogTest {
 protected:
  void TearDown() override { EXPECT_EQ(machine::Stop(), ""); }
};

// Windows forgives it for brushes and fonts that one is deleted while it is selected.
TEST_F(Drawing, ObjectsAreCountedUntilTheyAreDeleted) {
  const HDC dc = CreateCompatibleDC(nullptr);
  const HBRUSH brush = CreateSolidBrush(0);
  const HFONT font = CreateFontA(14, 0, 0, 0, 400, 0, 0, 0, 0, 0, 0, 0, 0, "Arial");
  const HBITMAP bitmap = LoadBitmapA(nullptr, MAKEINTRESOURCEA(120));
  const HGDIOBJ stock = SelectObject(dc, brush);
  EXPECT_EQ(DeleteObject(brush), FALSE);
  SelectObject(dc, stock);
  EXPECT_EQ(machine::OpenObjects(), "1 brush, 1 font, 1 bitmap, 1 device context");
  for (const HGDIOBJ object : {brush, font, bitmap}) EXPECT_EQ(DeleteObject(object), TRUE);
  DeleteDC(dc);
}

TEST_F(Drawing, ControlDrawsItselfWhenItIsShownAndHasChanged) {
  int drawings = 0;
  const auto draw = [&drawings](const DRAWITEMSTRUCT& item) {
    ++drawings;
    SetTextColor(item.hDC, 0xFF0000);
    const HBRUSH brush = CreateSolidBrush(0x6400);
    const HGDIOBJ old = SelectObject(item.hDC, brush);
    PatBlt(item.hDC, 1, 2, 30, 40, PATCOPY);
    SelectObject(item.hDC, old);
    DeleteObject(brush);
    RECT area = item.rcItem;
    DrawTextA(item.hDC, "caf\xE9 or more", 4, &area, DT_VCENTER);
    DrawFocusRect(item.hDC, &item.rcItem);
  };
  Run({Control("Static", 10, kShownControl | SS_OWNERDRAW), Control("Button", 11)},
      "wait\nwait\npress 11\nwait\nescape\n",
      [&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
        const HWND control = GetDlgItem(dialog, 10);
        if (message == WM_DRAWITEM) draw(*reinterpret_cast<const DRAWITEMSTRUCT*>(lParam));
        if (message == WM_COMMAND && LOWORD(wParam) == 11) {
          EXPECT_EQ(drawings, 1);  // idle twice, but nothing changed
          EXPECT_EQ(machine::FindWindowByHandle(control)->drawing.calls,
                    (std::vector<std::string>{"fill 1,2 30x40 006400",
                                              "text \"caf\xC3\xA9\" 0,0 format 4 0000FF on face",
                                              "focus"}));
          SetWindowTextA(control, "changed");
        }
        if (message == WM_COMMAND && LOWORD(wParam) == IDCANCEL) {
          EXPECT_EQ(drawings, 2);
          ShowWindow(control, SW_HIDE);
          SetWindowTextA(control, "hidden");
          EndDialog(dialog, 1);
        }
        return FALSE;
      });
  EXPECT_EQ(drawings, 2);
}

TEST_F(Drawing, ListDrawsItsFieldWithAndWithoutSelection) {
  std::string fields;
  Run({Control("ComboBox", 11, kShownControl | kOwnerDrawnList | WS_DISABLED),
       Control("Button", 12)},
      "press 12\nescape\n",
      [&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
        const HWND list = GetDlgItem(dialog, 11);
        if (message == WM_MEASUREITEM)
          reinterpret_cast<MEASUREITEMSTRUCT*>(lParam)->itemHeight = 19;
        if (message == WM_INITDIALOG) SendMessageA(list, CB_ADDSTRING, 0, 900);
        if (message == WM_DRAWITEM) {
          const auto& field = *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam);
          EXPECT_EQ(field.itemState & (ODS_SELECTED | ODS_FOCUS), 0u);
          fields += std::to_string(static_cast<int>(field.itemID)) + ": " +
                    std::to_string(field.itemData) + " high " +
                    std::to_string(field.rcItem.bottom) + "; ";
        }
        if (message == WM_COMMAND && LOWORD(wParam) == 12) SendMessageA(list, CB_SETCURSEL, 0, 0);
        if (message == WM_COMMAND && LOWORD(wParam) == IDCANCEL) EndDialog(dialog, 1);
        return FALSE;
      });
  EXPECT_EQ(fields, "-1: 0 high 19; 0: 900 high 19; ");
}

}  // namespace

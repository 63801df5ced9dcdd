// Controls that the dialog draws itself: a list and a text.
#include <algorithm>
#include <string>
#include <vector>

#include "tests/contract/standing_dialog.h"

using contract::Expect;
using contract::kStep;
using contract::RunDialog;
using contract::RunStanding;

CONTRACT(List, GivesBackWhatItWasGiven) {
  RunStanding([](HWND dialog) {
    const HWND list = GetDlgItem(dialog, 14);
    const struct {
      UINT message;
      WPARAM wParam;
      LPARAM lParam;
      LRESULT result;
    } rows[] = {
        {CB_GETCOUNT, 0, 0, 0},
        {CB_GETCURSEL, 0, 0, CB_ERR},
        {CB_GETITEMDATA, 0, 0, CB_ERR},
        {CB_SETCURSEL, 0, 0, CB_ERR},
        {CB_ADDSTRING, 0, 1000, 0},
        {CB_ADDSTRING, 0, 900, 1},
        {CB_GETCOUNT, 0, 0, 2},
        {CB_GETITEMDATA, 1, 0, 900},
        {CB_SETCURSEL, 1, 0, 1},
        {CB_GETCURSEL, 0, 0, 1},
        {CB_SETCURSEL, 2, 0, CB_ERR},
        {CB_SETCURSEL, 0, 0, 0},
        {CB_SETCURSEL, static_cast<WPARAM>(-1), 0, CB_ERR},
        {CB_GETCURSEL, 0, 0, CB_ERR},
        {CB_GETITEMDATA, 2, 0, CB_ERR},
        {CB_GETITEMDATA, static_cast<WPARAM>(-1), 0, CB_ERR},
        {CB_SETITEMDATA, 2, 5, CB_ERR},
        {CB_SETITEMDATA, 0, 5, TRUE},
        {CB_GETITEMDATA, 0, 0, 5},
    };
    for (size_t i = 0; i < std::size(rows); ++i) {
      Expect(SendMessageA(list, rows[i].message, rows[i].wParam, rows[i].lParam), rows[i].result,
             "row " + std::to_string(i));
    }
    Expect(SendMessageA(GetDlgItem(dialog, 11), CB_GETCOUNT, 0, 0), 0, "a button");
  });
}

CONTRACT(List, TellsOfEveryEntryThatGoes) {
  std::string order;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == WM_COMMAND && LOWORD(wParam) == 14 && HIWORD(wParam) == CBN_SELCHANGE) {
      order += "a choice of the program's own is no notice;";
    }
    if (message == WM_INITDIALOG) {
      const HWND list = GetDlgItem(dialog, 14);
      for (const LPARAM item : {1000, 0, 900}) SendMessageA(list, CB_ADDSTRING, 0, item);
      SendMessageA(list, CB_SETCURSEL, 1, 0);
      EndDialog(dialog, 1);
    }
    if (message == WM_DELETEITEM) {
      const auto& deleted = *reinterpret_cast<const DELETEITEMSTRUCT*>(lParam);
      Expect(wParam, 14);
      Expect(deleted.CtlType, ODT_COMBOBOX);
      Expect(deleted.CtlID, 14);
      Expect(IsWindow(deleted.hwndItem), TRUE);
      order += std::to_string(deleted.itemID) + " " + std::to_string(deleted.itemData) + ";";
    }
    return FALSE;
  });
  Expect(order, "2 900;1 0;0 1000;");
}

CONTRACT(Drawing, ControlsDrawThemselvesWhenNothingWaits) {
  std::vector<int> drawn;
  bool isStepDone = false;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == WM_INITDIALOG) PostMessageA(dialog, kStep, 0, 0);
    if (message == kStep) isStepDone = true;
    if (message == WM_DRAWITEM) {
      Expect(isStepDone, true);
      const auto& item = *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam);
      Expect(wParam, item.CtlID);
      Expect(item.hwndItem, GetDlgItem(dialog, static_cast<int>(item.CtlID)));
      Expect(item.hDC != nullptr, true);
      Expect(item.rcItem.right > item.rcItem.left && item.rcItem.bottom > item.rcItem.top, true);
      if (item.CtlID == 14) {
        Expect(item.CtlType, ODT_COMBOBOX);
        Expect(item.itemID, UINT32_MAX, "nothing is selected");
      }
      if (item.CtlID == 13) Expect(item.CtlType, 5);
      drawn.push_back(static_cast<int>(item.CtlID));
      const bool hasAll = std::ranges::count(drawn, 13) != 0 && std::ranges::count(drawn, 14) != 0;
      if (hasAll) EndDialog(dialog, 1);
    }
    return message == WM_DRAWITEM;
  });
}

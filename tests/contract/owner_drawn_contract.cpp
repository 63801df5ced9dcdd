// Controls that the dialog draws itself: a list and a text.
#include <algorithm>
#include <vector>

#include "tests/contract/standing_dialog.h"

namespace contract {

CONTRACT(List, GivesBackWhatItWasGiven) {
  RunStanding([](HWND dialog) {
    const auto send = [&](UINT message, int wParam = 0, LPARAM lParam = 0) {
      return SendMessageA(GetDlgItem(dialog, 14), message, static_cast<WPARAM>(wParam), lParam);
    };
    ExpectEach({send(CB_GETCURSEL), send(CB_GETITEMDATA), send(CB_SETCURSEL)}, {CB_ERR});
    ExpectEach({send(CB_GETCOUNT), send(CB_ADDSTRING, 0, 1000), send(CB_ADDSTRING, 0, 900),
                send(CB_GETCOUNT), send(CB_GETITEMDATA, 1), send(CB_SETCURSEL, 1),
                send(CB_GETCURSEL), send(CB_SETCURSEL, 2), send(CB_SETCURSEL, 0)},
               {0, 0, 1, 2, 900, 1, 1, CB_ERR, 0});
    ExpectEach({send(CB_SETCURSEL, -1), send(CB_GETCURSEL), send(CB_GETITEMDATA, 2),
                send(CB_GETITEMDATA, -1), send(CB_SETITEMDATA, 2, 5)},
               {CB_ERR});
    ExpectEach({send(CB_SETITEMDATA, 0, 5), send(CB_GETITEMDATA)}, {TRUE, 5});
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
      ExpectEach({wParam, deleted.CtlID}, {14});
      Expect(deleted.CtlType, ODT_COMBOBOX);
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
    if (message == kStep) isStepDone = true;
    if (message == WM_DRAWITEM) {
      Expect(isStepDone, true);
      const auto& item = *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam);
      const int id = static_cast<int>(item.CtlID);
      Expect(wParam, id);
      Expect(item.hwndItem, GetDlgItem(dialog, id));
      Expect(item.hDC != nullptr, true);
      Expect(item.rcItem.right > item.rcItem.left && item.rcItem.bottom > item.rcItem.top, true);
      Expect(item.CtlType, id == 14 ? ODT_COMBOBOX : 5);
      if (id == 14) Expect(item.itemID, UINT32_MAX, "nothing is selected");
      drawn.push_back(id);
      const bool hasAll = std::ranges::count(drawn, 13) != 0 && std::ranges::count(drawn, 14) != 0;
      if (hasAll) EndDialog(dialog, 1);
    }
    return message == WM_DRAWITEM;
  });
}

}  // namespace contract

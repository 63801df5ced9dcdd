// The dialog and its controls: start and end, look-ups, styles, texts, focus, default button, list,
// drawing. What a real window does besides, for its own sake, is not looked at.
#include "tests/contract/contract.h"

namespace contract {

CONTRACT(Dialog, InitialisesWithItsDataAndFirstTabStop) {
  std::string order;
  const Handler handler = [&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == WM_MEASUREITEM && wParam == 14 && order.empty()) order = "measure";
    if (message == WM_INITDIALOG) {
      const HWND edit = Item(10);
      order += ", init";
      // It stands until the handler returns.
      Expect({reinterpret_cast<HWND>(wParam), lParam, EndDialog(edit, 9), EndDialog(nullptr, 9),
              EndDialog(dialog, 3), EndDialog(dialog, 0x10004), Item(10)},
             {edit, kData, FALSE, FALSE, TRUE, TRUE, edit});
    }
    if (IsStep(message)) order += ", a step behind the end";
    return TRUE;
  };
  Expect({RunDialog(handler), order}, {0x10004, "measure, init"});
  Expect({DialogBoxParamA(GetModuleHandleA(nullptr), MAKEINTRESOURCEA(999), nullptr, nullptr, 0)},
         {-1}, "no such template");
}

CONTRACT(Dialog, LookUpsFollowRenumberingInTabOrder) {
  RunStanding([](HWND dialog) {
    const HWND first = Item(9);
    Expect({SetWindowLongA(first, GWL_ID, 20)}, {9});
    const HWND second = GetDlgItem(dialog, 9);
    Expect({second != nullptr && second != first, Item(20), GetWindowLongA(first, GWL_ID),
            SetWindowLongA(second, GWL_ID, 20), Item(20), Item(9), IsWindow(first),
            DestroyWindow(first), Item(20)},
           {true, first, 20, 9, first, nullptr, TRUE, TRUE, second});
    for (const HWND none : {first, HWND{nullptr}}) {
      Expect(
          {IsWindow(none), DestroyWindow(none), SetWindowLongA(none, GWL_ID, 12),
           GetWindowLongA(none, GWL_STYLE), ShowWindow(none, SW_HIDE), EnableWindow(none, TRUE),
           SetWindowTextA(none, "x"), SendMessageA(none, WM_GETTEXT, 0, 0), GetDlgItem(none, 10)},
          {0});
    }
  });
}

CONTRACT(Dialog, StyleTellsAndSetsTheState) {
  RunStanding([](HWND) {
    const HWND button = Item(11);
    const HWND text = Item(9);
    constexpr uint32_t kShown = 0x50010000;
    Expect({StyleOf(button), ShowWindow(button, SW_HIDE), ShowWindow(button, SW_HIDE),
            EnableWindow(button, FALSE), EnableWindow(button, FALSE), StyleOf(button),
            EnableWindow(button, TRUE), ShowWindow(button, SW_SHOW),
            SetWindowLongA(button, GWL_STYLE, static_cast<LONG>(kShown | 0xB00))},
           {kShown, TRUE, FALSE, FALSE, TRUE, 0x48010000, TRUE, FALSE, kShown});
    // The type is the low four bits; the others stay.
    for (const HWND control : {button, text}) SendMessageA(control, BM_SETSTYLE, 1, TRUE);
    Expect({StyleOf(button), StyleOf(text)}, {kShown | 0xB01, 0x50000100});
  });
}

CONTRACT(Dialog, TextsAreCutToTheBuffer) {
  RunStanding([](HWND dialog) {
    // The length told, and the text.
    const auto read = [](HWND window, WPARAM size) {
      char buffer[8] = "before";
      const auto length = SendMessageA(window, WM_GETTEXT, size, reinterpret_cast<LPARAM>(buffer));
      return std::to_string(length) + ' ' + buffer;
    };
    for (const int id : {9, 10, 11}) {
      const HWND control = Item(id);
      Expect(
          {SetWindowTextA(control, "abcdef"), read(control, 8), read(control, 4), read(control, 1),
           read(control, 0), SendMessageA(control, WM_SETTEXT, 0, reinterpret_cast<LPARAM>("x")),
           read(control, 8), SetWindowTextA(control, nullptr), read(control, 8)},
          {TRUE, "6 abcdef", "3 abc", "0 ", "0 before", TRUE, "1 x", TRUE, "0 "});
    }
    Expect({read(dialog, 8)}, {"5 Title"});
  });
}

CONTRACT(Focus, GoesToTheFirstTabStopUnlessTheProgramHasSetIt) {
  for (const int sets : {0, 1, 2, 3}) {  // the program: 1, the system: 2
    RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
      if (message == WM_INITDIALOG && (sets & 1) != 0) SetFocus(Item(11));
      if (message == kStep) {
        const HWND expected = Item(sets == 1 ? 11 : 10);
        Expect({SetFocus(expected), EndDialog(dialog, 1)}, {expected, TRUE}, std::to_string(sets));
      }
      return message == WM_INITDIALOG && (sets & 2) != 0;
    });
  }
}

CONTRACT(Focus, ControlThatGoesPassesItOn) {
  RunStanding([](HWND dialog) {
    const HWND edit = Item(10);
    const HWND button = Item(11);
    const HWND other = Item(12);
    SetFocus(edit);
    // A disabled control keeps nothing and gets nothing; the dialog passes it on.
    Expect({SetFocus(other), DestroyWindow(other), SetFocus(edit), ShowWindow(edit, SW_HIDE),
            SetFocus(button), ShowWindow(edit, SW_SHOW), SetFocus(button),
            EnableWindow(button, FALSE), SetFocus(button), SetFocus(nullptr)},
           {edit, TRUE, edit, TRUE, button, FALSE, button, FALSE, nullptr, nullptr});
    SetFocus(dialog);
    Expect({SetFocus(edit), SetFocus(nullptr), SetFocus(edit)}, {edit, edit, nullptr});
  });
}

// A program's private messages begin where two of the system's own stand. Left to it by the
// handler, they tell and set what the Enter key presses: by its id, without one by its type, never
// by focus.
CONTRACT(DefaultButton, IsThatOfTheIdAndElseOfTheType) {
  constexpr UINT kGetDefault = 0x400, kSetDefault = 0x401;  // DM_GETDEFID, DM_SETDEFID
  RunStanding([](HWND dialog) {
    const auto told = [dialog] {
      std::string types;
      for (const int id : {11, 12}) types += std::to_string(StyleOf(Item(id)) & 0xF);
      const auto answer = static_cast<DWORD>(SendMessageA(dialog, kGetDefault, 0, 0));
      return types + ' ' + std::to_string(LOWORD(answer)) + ' ' + std::to_string(HIWORD(answer));
    };
    const auto makeDefault = [](int id) {
      return SendMessageA(Item(id), BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    };
    Expect({told(), makeDefault(12)}, {"00 1 21323", 0});
    SetFocus(Item(11));
    Expect(
        {told(), SendMessageA(dialog, kSetDefault, 11, 0), told(),
         SendMessageA(dialog, kSetDefault, 0, 0), told(), makeDefault(12), makeDefault(11), told()},
        {"01 1 21323", TRUE, "10 11 21323", TRUE, "00 0 0", 0, 0, "11 11 21323"});
  });
}

CONTRACT(List, GivesBackWhatItWasGivenAndTellsOfEveryEntryThatGoes) {
  std::string order;
  const auto send = [](UINT message, int wParam = 0, LPARAM lParam = 0) {
    return SendMessageA(Item(14), message, static_cast<WPARAM>(wParam), lParam);
  };
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == WM_COMMAND && HIWORD(wParam) == CBN_SELCHANGE) order += "notice;";
    if (message == kStep) {
      Expect({send(CB_GETCURSEL), send(CB_GETITEMDATA), send(CB_SETCURSEL),
              send(CB_ADDSTRING, 0, 1000), send(CB_ADDSTRING, 0, 900), send(CB_GETCOUNT),
              send(CB_GETITEMDATA, 1), send(CB_SETCURSEL, 1), send(CB_GETCURSEL),
              send(CB_SETITEMDATA, 0, 5), send(CB_GETITEMDATA), send(CB_SETCURSEL, 0)},
             {CB_ERR, CB_ERR, CB_ERR, 0, 1, 2, 900, 1, 1, TRUE, 5, 0});
      Expect({send(CB_SETCURSEL, 2), send(CB_SETCURSEL, -1), send(CB_GETCURSEL),
              send(CB_GETITEMDATA, 2), send(CB_GETITEMDATA, -1), send(CB_SETITEMDATA, 2, 5)},
             {CB_ERR});
      Expect({send(CB_SETCURSEL, 1), send(CB_RESETCONTENT), send(CB_GETCURSEL), send(CB_GETCOUNT),
              send(CB_ADDSTRING, 0, 7), SendMessageA(Item(11), CB_GETCOUNT, 0, 0)},
             {1, TRUE, CB_ERR, 0, 0, 0}, "the last is a button");
      EndDialog(dialog, 1);
    }
    if (message == WM_DELETEITEM) {
      const auto& deleted = *reinterpret_cast<const DELETEITEMSTRUCT*>(lParam);
      Expect({wParam, deleted.CtlID, deleted.CtlType}, {14, 14, ODT_COMBOBOX});
      order += std::to_string(deleted.itemID) + " " + std::to_string(deleted.itemData) + ";";
    }
    return FALSE;
  });
  Expect({order}, {"1 900;0 5;0 7;"});
}

CONTRACT(Drawing, ControlsDrawThemselvesWhenNothingWaits) {
  std::string order;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == kStep) order = "step ";
    if (message != WM_DRAWITEM) return FALSE;
    const auto& item = *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam);
    const bool isList = wParam == 14;  // in which nothing is selected
    Expect({item.CtlID, item.hwndItem, item.CtlType, item.hDC != nullptr,
            item.rcItem.right > item.rcItem.left && item.rcItem.bottom > item.rcItem.top},
           {wParam, Item(isList ? 14 : 13), isList ? ODT_COMBOBOX : 5, true, true});
    if (isList) Expect({item.itemID}, {UINT32_MAX});
    order += isList ? "list " : "text ";
    if (order.find("list") < order.npos && order.find("text") < order.npos) EndDialog(dialog, 1);
    return TRUE;
  });
  Expect({order.substr(0, 5)}, {"step "});
}

}  // namespace contract

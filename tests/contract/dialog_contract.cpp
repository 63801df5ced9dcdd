// The dialog and its controls: start and end, look-ups, styles, texts, focus.
#include <cstdio>
#include <string>
#include <vector>

#include "tests/contract/standing_dialog.h"

using contract::Expect;
using contract::IsStep;
using contract::kData;
using contract::kStep;
using contract::RunDialog;
using contract::RunStanding;

namespace {

// The control that has the focus, by way of moving it there.
void ExpectFocus(HWND control, const std::string& row,
                 std::source_location where = std::source_location::current()) {
  Expect(SetFocus(control), control, row, where);
}

uint32_t StyleOf(HWND window) {
  return static_cast<uint32_t>(GetWindowLongA(window, GWL_STYLE));
}

}  // namespace

CONTRACT(Dialog, InitialisesWithItsDataAndFirstTabStop) {
  std::vector<std::string> order;
  const INT_PTR result =
      RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
        if (message == WM_MEASUREITEM) {
          const auto& measure = *reinterpret_cast<const MEASUREITEMSTRUCT*>(lParam);
          Expect(wParam, 14);
          Expect(measure.CtlID, 14);
          Expect(measure.CtlType, ODT_COMBOBOX);
          if (order.empty()) order.push_back("measure");
        }
        if (message == WM_INITDIALOG) {
          Expect(wParam, reinterpret_cast<WPARAM>(GetDlgItem(dialog, 10)));
          Expect(lParam, kData);
          order.push_back("init");
          Expect(EndDialog(GetDlgItem(dialog, 10), 9), FALSE, "no dialog");
          Expect(EndDialog(nullptr, 9), FALSE);
          Expect(EndDialog(dialog, 3), TRUE);
          Expect(EndDialog(dialog, 0x10004), TRUE);
          Expect(GetDlgItem(dialog, 10) != nullptr, true, "it stands until the handler returns");
          PostMessageA(dialog, kStep, 0, 0);
        }
        if (IsStep(message)) order.push_back("a step behind the end");
        return TRUE;
      });
  Expect(result, 0x10004);
  Expect(order.size(), 2);
  Expect(order[0] + ", " + order.back(), "measure, init");
  Expect(DialogBoxParamA(GetModuleHandleA(nullptr), MAKEINTRESOURCEA(999), nullptr, nullptr, 0), -1,
         "no such template");
}

CONTRACT(Dialog, LookUpsFollowRenumberingInTabOrder) {
  RunStanding([](HWND dialog) {
    const HWND first = GetDlgItem(dialog, 9);
    Expect(SetWindowLongA(first, GWL_ID, 20), 9);
    const HWND second = GetDlgItem(dialog, 9);
    Expect(second != nullptr && second != first, true);
    Expect(GetDlgItem(dialog, 20), first);
    Expect(GetWindowLongA(first, GWL_ID), 20);
    Expect(SetWindowLongA(second, GWL_ID, 20), 9);
    Expect(GetDlgItem(dialog, 20), first);
    Expect(GetDlgItem(dialog, 9), nullptr);

    Expect(IsWindow(first), TRUE);
    Expect(DestroyWindow(first), TRUE);
    Expect(IsWindow(first), FALSE);
    Expect(GetDlgItem(dialog, 20), second);
    for (const HWND none : {first, HWND{nullptr}}) {
      Expect(IsWindow(none), FALSE);
      Expect(DestroyWindow(none), FALSE);
      Expect(SetWindowLongA(none, GWL_ID, 12), 0);
      Expect(GetWindowLongA(none, GWL_STYLE), 0);
      Expect(ShowWindow(none, SW_HIDE), FALSE);
      Expect(EnableWindow(none, TRUE), FALSE);
      Expect(SetWindowTextA(none, "x"), FALSE);
      Expect(SendMessageA(none, WM_GETTEXT, 0, 0), 0);
      Expect(GetDlgItem(none, 10), nullptr);
    }
  });
}

CONTRACT(Dialog, StyleTellsAndSetsTheState) {
  RunStanding([](HWND dialog) {
    const HWND button = GetDlgItem(dialog, 11);
    constexpr uint32_t kShown = 0x50010000;
    Expect(StyleOf(button), kShown);
    Expect(ShowWindow(button, SW_HIDE), TRUE);
    Expect(ShowWindow(button, SW_HIDE), FALSE);
    Expect(EnableWindow(button, FALSE), FALSE);
    Expect(EnableWindow(button, FALSE), TRUE);
    Expect(StyleOf(button), (kShown & ~0x10000000u) | 0x08000000u);
    Expect(EnableWindow(button, TRUE), TRUE);
    Expect(ShowWindow(button, SW_SHOW), FALSE);
    Expect(SetWindowLongA(button, GWL_STYLE, static_cast<LONG>(kShown | 0xB00)), kShown);
    // The type is the low four bits; the others stay.
    SendMessageA(button, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    Expect(StyleOf(button), kShown | 0xB01);
    const HWND text = GetDlgItem(dialog, 9);
    SendMessageA(text, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    Expect(StyleOf(text), 0x50000100);
  });
}

CONTRACT(Dialog, TextsAreCutToTheBuffer) {
  RunStanding([](HWND dialog) {
    char buffer[8];
    const auto read = [&](HWND window, WPARAM size) {
      std::snprintf(buffer, sizeof(buffer), "before");
      return SendMessageA(window, WM_GETTEXT, size, reinterpret_cast<LPARAM>(buffer));
    };
    for (const int id : {9, 10, 11}) {
      const HWND control = GetDlgItem(dialog, id);
      const std::string row = std::to_string(id);
      Expect(SetWindowTextA(control, "abcdef"), TRUE, row);
      Expect(read(control, sizeof(buffer)), 6, row);
      Expect(buffer, "abcdef", row);
      Expect(read(control, 4), 3, row);
      Expect(buffer, "abc", row);
      Expect(read(control, 1), 0, row);
      Expect(buffer, "", row);
      Expect(read(control, 0), 0, row);
      Expect(buffer, "before", row);
      Expect(SendMessageA(control, WM_SETTEXT, 0, reinterpret_cast<LPARAM>("x")), TRUE, row);
      Expect(SetWindowTextA(control, nullptr), TRUE, row);
      Expect(read(control, sizeof(buffer)), 0, row);
    }
    Expect(read(dialog, sizeof(buffer)), 5);
    Expect(buffer, "Title");
  });
}

CONTRACT(Focus, GoesToTheFirstTabStopUnlessTheProgramHasSetIt) {
  for (const bool systemSets : {false, true}) {
    for (const bool programSets : {false, true}) {
      RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
        if (message == WM_INITDIALOG) {
          if (programSets) SetFocus(GetDlgItem(dialog, 11));
          PostMessageA(dialog, kStep, 0, 0);
          return systemSets;
        }
        if (message == kStep) {
          ExpectFocus(GetDlgItem(dialog, programSets && !systemSets ? 11 : 10),
                      std::to_string(systemSets) + std::to_string(programSets));
          EndDialog(dialog, 1);
        }
        return FALSE;
      });
    }
  }
}

CONTRACT(Focus, ControlThatGoesPassesItOn) {
  RunStanding([](HWND dialog) {
    const HWND edit = GetDlgItem(dialog, 10);
    const HWND button = GetDlgItem(dialog, 11);
    const HWND other = GetDlgItem(dialog, 12);
    SetFocus(edit);
    Expect(SetFocus(other), edit);
    DestroyWindow(other);
    ExpectFocus(edit, "destroyed");
    ShowWindow(edit, SW_HIDE);
    ExpectFocus(button, "hidden");
    ShowWindow(edit, SW_SHOW);
    ExpectFocus(button, "shown again");
    // A disabled control keeps nothing and gets nothing.
    EnableWindow(button, FALSE);
    Expect(SetFocus(button), nullptr);
    Expect(SetFocus(nullptr), nullptr);
    SetFocus(dialog);
    ExpectFocus(edit, "the dialog passes it on");
    Expect(SetFocus(nullptr), edit);
    Expect(SetFocus(edit), nullptr);
  });
}

// The dialog and its controls: start and end, look-ups, styles, texts, focus, default button.
#include <cstdio>
#include <vector>

#include "tests/contract/standing_dialog.h"

namespace contract {

CONTRACT(Dialog, InitialisesWithItsDataAndFirstTabStop) {
  std::string order;
  const INT_PTR result =
      RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
        if (message == WM_MEASUREITEM) {
          const auto& measure = *reinterpret_cast<const MEASUREITEMSTRUCT*>(lParam);
          ExpectEach({wParam, measure.CtlID}, 14);
          Expect(measure.CtlType, ODT_COMBOBOX);
          if (order.empty()) order = "measure";
        }
        if (message == WM_INITDIALOG) {
          const HWND edit = GetDlgItem(dialog, 10);
          Expect(reinterpret_cast<HWND>(wParam), edit);
          Expect(lParam, kData);
          order += ", init";
          ExpectEach({EndDialog(edit, 9), EndDialog(nullptr, 9)}, FALSE, "no dialog");
          ExpectEach({EndDialog(dialog, 3), EndDialog(dialog, 0x10004)}, TRUE);
          Expect(GetDlgItem(dialog, 10), edit, "it stands until the handler returns");
        }
        if (IsStep(message)) order += ", a step behind the end";
        return TRUE;
      });
  Expect(result, 0x10004);
  Expect(order, "measure, init");
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

    ExpectEach({IsWindow(first), DestroyWindow(first)}, TRUE);
    Expect(GetDlgItem(dialog, 20), second);
    for (const HWND none : {first, HWND{nullptr}}) {
      ExpectEach(
          {IsWindow(none), DestroyWindow(none), SetWindowLongA(none, GWL_ID, 12),
           GetWindowLongA(none, GWL_STYLE), ShowWindow(none, SW_HIDE), EnableWindow(none, TRUE),
           SetWindowTextA(none, "x"), SendMessageA(none, WM_GETTEXT, 0, 0), GetDlgItem(none, 10)},
          0);
    }
  });
}

CONTRACT(Dialog, StyleTellsAndSetsTheState) {
  RunStanding([](HWND dialog) {
    const HWND button = GetDlgItem(dialog, 11);
    constexpr uint32_t kShown = 0x50010000;
    Expect(StyleOf(button), kShown);
    Expect(ShowWindow(button, SW_HIDE), TRUE);
    ExpectEach({ShowWindow(button, SW_HIDE), EnableWindow(button, FALSE)}, FALSE);
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
    // The length told, and the text.
    const auto read = [](HWND window, WPARAM size) {
      char buffer[8] = "before";
      const auto length = SendMessageA(window, WM_GETTEXT, size, reinterpret_cast<LPARAM>(buffer));
      return std::to_string(length) + ' ' + buffer;
    };
    for (const int id : {9, 10, 11}) {
      const HWND control = GetDlgItem(dialog, id);
      const std::string row = std::to_string(id);
      Expect(SetWindowTextA(control, "abcdef"), TRUE, row);
      Expect(read(control, 8), "6 abcdef", row);
      Expect(read(control, 4), "3 abc", row);
      Expect(read(control, 1), "0 ", row);
      Expect(read(control, 0), "0 before", row);
      ExpectEach({SendMessageA(control, WM_SETTEXT, 0, reinterpret_cast<LPARAM>("x")),
                  SetWindowTextA(control, nullptr)},
                 TRUE, row);
      Expect(read(control, 8), "0 ", row);
    }
    Expect(read(dialog, 8), "5 Title");
  });
}

CONTRACT(Focus, GoesToTheFirstTabStopUnlessTheProgramHasSetIt) {
  for (const bool systemSets : {false, true}) {
    for (const bool programSets : {false, true}) {
      RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
        if (message == WM_INITDIALOG && programSets) SetFocus(GetDlgItem(dialog, 11));
        if (message == kStep) {
          const HWND expected = GetDlgItem(dialog, programSets && !systemSets ? 11 : 10);
          Expect(SetFocus(expected), expected,
                 std::to_string(systemSets) + std::to_string(programSets));
          EndDialog(dialog, 1);
        }
        return message == WM_INITDIALOG && systemSets;
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
    Expect(SetFocus(edit), edit, "destroyed");
    ShowWindow(edit, SW_HIDE);
    Expect(SetFocus(button), button, "hidden");
    ShowWindow(edit, SW_SHOW);
    Expect(SetFocus(button), button, "shown again");
    // A disabled control keeps nothing and gets nothing.
    EnableWindow(button, FALSE);
    ExpectEach({SetFocus(button), SetFocus(nullptr)}, nullptr);
    SetFocus(dialog);
    ExpectEach({SetFocus(edit), SetFocus(nullptr)}, edit, "the dialog passes it on");
    Expect(SetFocus(edit), nullptr);
  });
}

// A program's private messages begin where two of the system's own stand. Left to it by the
// handler, they tell and set what the Enter key presses: by its id, without one by its type, never
// by focus.
CONTRACT(DefaultButton, IsThatOfTheIdAndElseOfTheType) {
  constexpr UINT kGetDefault = 0x400;  // DM_GETDEFID
  constexpr UINT kSetDefault = 0x401;  // DM_SETDEFID
  const auto told = [](HWND dialog) {
    std::string types;
    for (const int id : {11, 12}) types += std::to_string(StyleOf(GetDlgItem(dialog, id)) & 0xF);
    const auto answer = static_cast<DWORD>(SendMessageA(dialog, kGetDefault, 0, 0));
    return types + ' ' + std::to_string(LOWORD(answer)) + ' ' + std::to_string(HIWORD(answer));
  };
  RunStanding([&](HWND dialog) {
    const HWND first = GetDlgItem(dialog, 11);
    const HWND second = GetDlgItem(dialog, 12);
    Expect(told(dialog), "00 1 21323");
    SendMessageA(second, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    SetFocus(first);
    Expect(told(dialog), "01 1 21323");
    Expect(SendMessageA(dialog, kSetDefault, 11, 0), TRUE);
    Expect(told(dialog), "10 11 21323");
    PostMessageA(dialog, kSetDefault, 0, 0);
    MSG posted = {};
    while (PeekMessageA(&posted, nullptr, 0, 0, PM_REMOVE) != FALSE) DispatchMessageA(&posted);
    Expect(told(dialog), "00 0 0");
    for (const HWND button : {second, first}) {
      SendMessageA(button, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    }
    Expect(told(dialog), "11 11 21323");
  });
}

}  // namespace contract

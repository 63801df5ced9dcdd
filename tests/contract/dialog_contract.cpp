// The dialog and its controls: start and end, look-ups, styles, texts, focus, default button.
#include "tests/contract/standing_dialog.h"

namespace contract {

CONTRACT(Dialog, InitialisesWithItsDataAndFirstTabStop) {
  std::string order;
  const INT_PTR result =
      RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
        if (message == WM_MEASUREITEM) {
          const auto& measure = *reinterpret_cast<const MEASUREITEMSTRUCT*>(lParam);
          ExpectEach({wParam, measure.CtlID}, {14});
          Expect(measure.CtlType, ODT_COMBOBOX);
          if (order.empty()) order = "measure";
        }
        if (message == WM_INITDIALOG) {
          const HWND edit = GetDlgItem(dialog, 10);
          Expect(reinterpret_cast<HWND>(wParam), edit);
          Expect(lParam, kData);
          order += ", init";
          ExpectEach({EndDialog(edit, 9), EndDialog(nullptr, 9)}, {FALSE}, "no dialog");
          ExpectEach({EndDialog(dialog, 3), EndDialog(dialog, 0x10004)}, {TRUE});
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
    ExpectEach({GetDlgItem(dialog, 20), GetWindowLongA(first, GWL_ID),
                SetWindowLongA(second, GWL_ID, 20), GetDlgItem(dialog, 20), GetDlgItem(dialog, 9),
                IsWindow(first), DestroyWindow(first), GetDlgItem(dialog, 20)},
               {first, 20, 9, first, nullptr, TRUE, TRUE, second});
    for (const HWND none : {first, HWND{nullptr}}) {
      ExpectEach(
          {IsWindow(none), DestroyWindow(none), SetWindowLongA(none, GWL_ID, 12),
           GetWindowLongA(none, GWL_STYLE), ShowWindow(none, SW_HIDE), EnableWindow(none, TRUE),
           SetWindowTextA(none, "x"), SendMessageA(none, WM_GETTEXT, 0, 0), GetDlgItem(none, 10)},
          {0});
    }
  });
}

CONTRACT(Dialog, StyleTellsAndSetsTheState) {
  RunStanding([](HWND dialog) {
    const HWND button = GetDlgItem(dialog, 11);
    constexpr uint32_t kShown = 0x50010000;
    ExpectEach({StyleOf(button), ShowWindow(button, SW_HIDE), ShowWindow(button, SW_HIDE),
                EnableWindow(button, FALSE), EnableWindow(button, FALSE), StyleOf(button),
                EnableWindow(button, TRUE), ShowWindow(button, SW_SHOW),
                SetWindowLongA(button, GWL_STYLE, static_cast<LONG>(kShown | 0xB00))},
               {kShown, TRUE, FALSE, FALSE, TRUE, 0x48010000, TRUE, FALSE, kShown});
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
      ExpectEach(
          {SetWindowTextA(control, "abcdef"), read(control, 8), read(control, 4), read(control, 1),
           read(control, 0), SendMessageA(control, WM_SETTEXT, 0, reinterpret_cast<LPARAM>("x")),
           read(control, 8), SetWindowTextA(control, nullptr), read(control, 8)},
          {TRUE, "6 abcdef", "3 abc", "0 ", "0 before", TRUE, "1 x", TRUE, "0 "});
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
    ExpectEach({SetFocus(other), DestroyWindow(other), SetFocus(edit)}, {edit, TRUE, edit});
    ExpectEach({ShowWindow(edit, SW_HIDE), SetFocus(button)}, {TRUE, button});
    ExpectEach({ShowWindow(edit, SW_SHOW), SetFocus(button)}, {FALSE, button});
    // A disabled control keeps nothing and gets nothing.
    ExpectEach({EnableWindow(button, FALSE), SetFocus(button), SetFocus(nullptr)}, {0});
    SetFocus(dialog);  // it passes it on
    ExpectEach({SetFocus(edit), SetFocus(nullptr), SetFocus(edit)}, {edit, edit, nullptr});
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
    Expect(SendMessageA(dialog, kSetDefault, 0, 0), TRUE);
    Expect(told(dialog), "00 0 0");
    for (const HWND button : {second, first}) {
      SendMessageA(button, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    }
    Expect(told(dialog), "11 11 21323");
  });
}

}  // namespace contract

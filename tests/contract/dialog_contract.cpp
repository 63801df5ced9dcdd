// The dialog, its controls and its messages. Each case runs the dialog of contract.rc with its own
// handler. What a real window does besides, for its own sake, is not looked at.
#include <algorithm>
#include <cstdio>
#include <functional>
#include <vector>

#include "tests/contract/contract.h"

using contract::Expect;

namespace {

constexpr UINT kStep = 0x8001;
constexpr UINT kNextStep = 0x8002;
constexpr UINT kLastStep = 0x8003;
constexpr UINT kButtonDown = 0x201;
constexpr UINT kButtonUp = 0x202;
constexpr int kEditChange = 0x300;
constexpr int kEditUpdate = 0x400;
constexpr LPARAM kData = 77;

using Handler = std::function<INT_PTR(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam)>;
Handler handler;  // of the case that runs

INT_PTR CALLBACK CallHandler(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
  return handler(dialog, message, wParam, lParam);
}

INT_PTR Run(Handler handlerOfCase) {
  handler = std::move(handlerOfCase);
  const INT_PTR result = DialogBoxParamA(GetModuleHandleA(nullptr), MAKEINTRESOURCEA(100), nullptr,
                                         CallHandler, kData);
  handler = nullptr;
  return result;
}

// Runs `check` in a dialog that stands, and ends it.
void RunStanding(const std::function<void(HWND dialog)>& check) {
  const INT_PTR result = Run([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message == WM_INITDIALOG) PostMessageA(dialog, kStep, 0, 0);
    if (message == kStep) {
      check(dialog);
      EndDialog(dialog, 5);
    }
    return FALSE;
  });
  Expect(result, 5);
}

bool IsStep(UINT message) {
  return message == kStep || message == kNextStep || message == kLastStep;
}

// The next posted step, taken out of the queue; others are dispatched on the way. 0 for none.
MSG TakeStep() {
  MSG message = {};
  while (PeekMessageA(&message, nullptr, 0, 0, PM_REMOVE) != FALSE) {
    if (IsStep(message.message)) return message;
    TranslateMessage(&message);
    DispatchMessageA(&message);
  }
  return {};
}

// The control that has the focus, by way of moving it there.
void ExpectFocus(HWND control, const std::string& row,
                 std::source_location where = std::source_location::current()) {
  Expect(SetFocus(control), control, row, where);
}

void PostClick(HWND control) {
  PostMessageA(control, kButtonDown, 1, 0x00020002);
  PostMessageA(control, kButtonUp, 0, 0x00020002);
}

uint32_t StyleOf(HWND window) {
  return static_cast<uint32_t>(GetWindowLongA(window, GWL_STYLE));
}

}  // namespace

CONTRACT(Dialog, InitialisesWithItsDataAndFirstTabStop) {
  std::vector<std::string> order;
  const INT_PTR result =
      Run([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
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
  Expect(DialogBoxParamA(GetModuleHandleA(nullptr), MAKEINTRESOURCEA(999), nullptr, CallHandler, 0),
         -1, "no such template");
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

CONTRACT(Dialog, SentMessageAnswersNothingOfTheHandlers) {
  Run([](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
    if (message == WM_INITDIALOG) {
      // What a handler returns tells only whether it has handled the message.
      Expect(SendMessageA(dialog, kStep, 1, 0), 0);
      Expect(SendMessageA(dialog, WM_COMMAND, 77, 0), 0);
      EndDialog(dialog, 1);
    }
    return message == kStep || (message == WM_COMMAND && LOWORD(wParam) == 77) ? 5 : FALSE;
  });
}

CONTRACT(Dialog, PostedMessagesComeInTheirOrder) {
  std::vector<UINT> order;
  Run([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == WM_INITDIALOG) {
      Expect(PostMessageA(dialog, kStep, 1, 2), TRUE);
      Expect(PostMessageA(dialog, kNextStep, 0, 0), TRUE);
    }
    if (IsStep(message)) order.push_back(message);
    if (message == kStep) {
      Expect(wParam, 1);
      Expect(lParam, 2);
      PostMessageA(dialog, kLastStep, 0, 0);
      Expect(order.size(), 1, "none runs inside the call");
    }
    if (message == kLastStep) {
      EndDialog(dialog, 1);
      PostMessageA(dialog, kStep, 0, 0);  // too late: the loop has ended
    }
    return FALSE;
  });
  Expect(order == std::vector<UINT>{kStep, kNextStep, kLastStep}, true);
}

CONTRACT(Dialog, PolledMessagesAreThoseOfWindowsThatStand) {
  RunStanding([](HWND dialog) {
    const HWND gone = GetDlgItem(dialog, 9);
    Expect(PostMessageA(gone, kStep, 0, 0), TRUE);
    Expect(PostMessageA(dialog, kNextStep, 3, 4), TRUE);
    Expect(PostMessageA(nullptr, kLastStep, 0, 0), TRUE, "of the thread");
    DestroyWindow(gone);
    Expect(PostMessageA(gone, kStep, 0, 0), FALSE);
    MSG message = TakeStep();
    Expect(message.message, kNextStep);
    Expect(message.hwnd, dialog);
    Expect(message.wParam, 3);
    Expect(message.lParam, 4);
    message = TakeStep();
    Expect(message.message, kLastStep);
    Expect(message.hwnd, nullptr);
    Expect(DispatchMessageA(&message), 0);
    Expect(TakeStep().message, 0);
  });
}

CONTRACT(Dialog, EndInsideANestedHandlerWaitsForTheOuterOne) {
  bool isOuterDone = false;
  const INT_PTR result = Run([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message == WM_INITDIALOG) PostMessageA(dialog, kStep, 0, 0);
    if (message == kStep) {
      PostMessageA(dialog, kNextStep, 0, 0);
      PostMessageA(dialog, kLastStep, 0, 0);
      const MSG next = TakeStep();
      Expect(next.message, kNextStep);
      DispatchMessageA(&next);
      Expect(IsWindow(dialog), TRUE);
      Expect(GetDlgItem(dialog, 10) != nullptr, true);
      isOuterDone = true;
    }
    if (message == kNextStep) EndDialog(dialog, 7);
    Expect(message == kLastStep, false);
    return FALSE;
  });
  Expect(isOuterDone, true);
  Expect(result, 7);
}

CONTRACT(Dialog, ClickGivesTheIdOfThatMoment) {
  std::vector<int> commands;
  Run([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == WM_INITDIALOG) PostMessageA(dialog, kStep, 0, 0);
    if (message == kStep) {
      // Only the last can be clicked on: a text without SS_NOTIFY, disabled, hidden, renumbered.
      SetWindowLongA(GetDlgItem(dialog, 11), GWL_ID, 21);
      const HWND notified = GetDlgItem(dialog, 9);
      SetWindowLongA(notified, GWL_ID, 20);
      PostClick(GetDlgItem(dialog, 9));
      PostClick(GetDlgItem(dialog, 21));
      PostClick(notified);
      PostMessageA(dialog, kLastStep, 0, 0);
    }
    if (message == WM_COMMAND && HIWORD(wParam) == 0) {
      commands.push_back(LOWORD(wParam));
      Expect(reinterpret_cast<HWND>(lParam), GetDlgItem(dialog, LOWORD(wParam)));
      if (LOWORD(wParam) == 21) ExpectFocus(GetDlgItem(dialog, 21), "a button takes it");
    }
    if (message == kLastStep) EndDialog(dialog, 1);
    return FALSE;
  });
  Expect(commands == std::vector<int>{21, 20}, true);
}

CONTRACT(Dialog, EditFieldTellsOfEveryChange) {
  std::vector<int> notices;
  Run([&](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
    const bool isNotice = message == WM_COMMAND && LOWORD(wParam) == 10;
    if (isNotice && HIWORD(wParam) >= kEditChange) notices.push_back(HIWORD(wParam));
    if (message == WM_INITDIALOG) PostMessageA(dialog, kStep, 0, 0);
    if (message == kStep) {
      SetWindowTextA(GetDlgItem(dialog, 10), "by program");
      SetWindowTextA(GetDlgItem(dialog, 11), "a button");
      SendMessageA(GetDlgItem(dialog, 10), EM_SETSEL, 0, -1);
      EndDialog(dialog, 1);
    }
    return FALSE;
  });
  Expect(notices == std::vector<int>{kEditUpdate, kEditChange}, true);
}

CONTRACT(Focus, GoesToTheFirstTabStopUnlessTheProgramHasSetIt) {
  for (const bool systemSets : {false, true}) {
    for (const bool programSets : {false, true}) {
      Run([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
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
  Run([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
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
  Run([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
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

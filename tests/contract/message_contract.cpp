// Messages: what is sent, posted and polled, what a click and a change of text bring.
#include <vector>

#include "tests/contract/standing_dialog.h"

namespace contract {
namespace {

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

void PostClick(HWND control) {
  constexpr UINT kButtonDown = 0x201;
  constexpr UINT kButtonUp = 0x202;
  PostMessageA(control, kButtonDown, 1, 0x00020002);
  PostMessageA(control, kButtonUp, 0, 0x00020002);
}

}  // namespace

CONTRACT(Messages, SentMessageAnswersNothingOfTheHandlers) {
  RunDialog([](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
    if (message == WM_INITDIALOG) {
      // What a handler returns tells only whether it has handled the message.
      ExpectEach({SendMessageA(dialog, kStep, 1, 0), SendMessageA(dialog, WM_COMMAND, 77, 0)}, {0});
      EndDialog(dialog, 1);
    }
    return message == kStep || (message == WM_COMMAND && LOWORD(wParam) == 77) ? 5 : FALSE;
  });
}

CONTRACT(Messages, PostedMessagesComeInTheirOrder) {
  std::vector<UINT> order;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (IsStep(message)) order.push_back(message);
    if (message == kStep) {
      ExpectEach({PostMessageA(dialog, kNextStep, 1, 2), PostMessageA(dialog, kLastStep, 0, 0)},
                 {TRUE});
      Expect(order.size(), 1, "none runs inside the call");
    }
    if (message == kNextStep) Expect(wParam * 10 + static_cast<WPARAM>(lParam), 12);
    if (message == kLastStep) {
      EndDialog(dialog, 1);
      PostMessageA(dialog, kStep, 0, 0);  // too late: the loop has ended
    }
    return FALSE;
  });
  Expect(order == std::vector<UINT>{kStep, kNextStep, kLastStep}, true);
}

CONTRACT(Messages, PolledMessagesAreThoseOfWindowsThatStand) {
  RunStanding([](HWND dialog) {
    const HWND gone = GetDlgItem(dialog, 9);
    ExpectEach({PostMessageA(gone, kStep, 0, 0), PostMessageA(dialog, kNextStep, 3, 4),
                PostMessageA(nullptr, kLastStep, 0, 0)},
               {TRUE}, "the last is the thread's own");
    DestroyWindow(gone);
    Expect(PostMessageA(gone, kStep, 0, 0), FALSE);
    const MSG own = TakeStep();
    ExpectEach({own.message, own.hwnd, own.wParam, own.lParam}, {kNextStep, dialog, 3, 4});
    const MSG nobodys = TakeStep();
    ExpectEach({nobodys.message, nobodys.hwnd}, {kLastStep, nullptr});
    ExpectEach({DispatchMessageA(&nobodys), TakeStep().message}, {0});
  });
}

CONTRACT(Messages, EndInsideANestedHandlerWaitsForTheOuterOne) {
  bool isOuterDone = false;
  const INT_PTR result = RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message == kStep) {
      for (const UINT step : {kNextStep, kLastStep}) PostMessageA(dialog, step, 0, 0);
      const MSG next = TakeStep();
      Expect(next.message, kNextStep);
      DispatchMessageA(&next);
      Expect(IsWindow(dialog) && GetDlgItem(dialog, 10) != nullptr, true);
      isOuterDone = true;
    }
    if (message == kNextStep) EndDialog(dialog, 7);
    Expect(message == kLastStep, false);
    return FALSE;
  });
  Expect(isOuterDone, true);
  Expect(result, 7);
}

CONTRACT(Messages, ClickGivesTheIdOfThatMoment) {
  std::string commands;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == kStep) {
      // The first has no SS_NOTIFY; the others have been renumbered.
      SetWindowLongA(GetDlgItem(dialog, 11), GWL_ID, 21);
      SetWindowLongA(GetDlgItem(dialog, 9), GWL_ID, 20);
      for (const int id : {9, 21, 20}) PostClick(GetDlgItem(dialog, id));
      PostMessageA(dialog, kLastStep, 0, 0);
    }
    if (message == WM_COMMAND && HIWORD(wParam) == 0) {
      commands += std::to_string(LOWORD(wParam)) + ' ';
      Expect(reinterpret_cast<HWND>(lParam), GetDlgItem(dialog, LOWORD(wParam)));
      const HWND button = GetDlgItem(dialog, 21);
      if (LOWORD(wParam) == 21) Expect(SetFocus(button), button, "the click has moved it there");
    }
    if (message == kLastStep) EndDialog(dialog, 1);
    return FALSE;
  });
  Expect(commands, "21 20 ");
}

CONTRACT(Messages, EditFieldTellsOfEveryChange) {
  std::string notices;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
    const bool isOfFocus = HIWORD(wParam) < 0x300;
    if (message == WM_COMMAND && LOWORD(wParam) == 10 && !isOfFocus) {
      notices += std::to_string(HIWORD(wParam)) + ' ';
    }
    if (message == kStep) {
      SetWindowTextA(GetDlgItem(dialog, 10), "by program");
      SetWindowTextA(GetDlgItem(dialog, 11), "a button");
      SendMessageA(GetDlgItem(dialog, 10), EM_SETSEL, 0, -1);
      EndDialog(dialog, 1);
    }
    return FALSE;
  });
  Expect(notices, "1024 768 ");  // EN_UPDATE, EN_CHANGE
}

}  // namespace contract

// Messages: what is sent, posted and polled, what a click and a change of text bring; message boxes
// and the folder picker, whose texts are looked at by the scenarios.
#include "tests/contract/contract.h"

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
  constexpr UINT kButtonDown = 0x201, kButtonUp = 0x202;
  PostMessageA(control, kButtonDown, 1, 0x00020002);
  PostMessageA(control, kButtonUp, 0, 0x00020002);
}

// Runs `ask` in a dialog that has the focus on its first button. The step that was posted before it
// runs while the question stands, with the dialog disabled.
void RunAsking(const std::function<void(HWND dialog)>& ask) {
  DWORD style = 0;  // of the dialog under the question
  const Check askAfterAStep = [&](HWND dialog) {
    SetFocus(Item(11));
    PostMessageA(dialog, kNextStep, 0, 0);
    ask(dialog);
    Expect({SetFocus(Item(11)), StyleOf(dialog) & WS_DISABLED, style & WS_DISABLED},
           {Item(11), 0, WS_DISABLED});
  };
  RunStanding(askAfterAStep, [&](HWND dialog) { style = StyleOf(dialog); });
}

}  // namespace

CONTRACT(Messages, ArePolledInTheirOrderAndSentAtOnce) {
  std::string order;
  const INT_PTR result = RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (!IsStep(message)) return FALSE;
    order += std::to_string(message - kStep) + ' ';
    if (message == kNextStep) EndDialog(dialog, 7);
    if (message != kStep) return 5;
    const HWND gone = Item(9);
    // What waits for a window that goes is gone too; the third is the thread's own. What a handler
    // returns for the sent one tells only whether it has handled it.
    Expect({PostMessageA(gone, kStep, 0, 0), PostMessageA(dialog, kNextStep, 3, 4),
            PostMessageA(nullptr, kLastStep, 0, 0), DestroyWindow(gone),
            PostMessageA(gone, kStep, 0, 0), order, SendMessageA(dialog, kLastStep, 0, 0), order},
           {TRUE, TRUE, TRUE, TRUE, FALSE, "0 ", 0, "0 2 "});
    const MSG own = TakeStep(), nobodys = TakeStep();
    Expect({own.message, own.hwnd, own.wParam, own.lParam, nobodys.message, nobodys.hwnd,
            DispatchMessageA(&nobodys), TakeStep().message},
           {kNextStep, dialog, 3, 4, kLastStep, nullptr, 0, 0});
    // An end inside a nested handler waits for the outer one, and what waits then comes no more.
    DispatchMessageA(&own);
    Expect({PostMessageA(dialog, kLastStep, 0, 0), IsWindow(dialog), Item(10) != nullptr}, {TRUE});
    return FALSE;
  });
  Expect({order, result}, {"0 2 1 ", 7});
}

CONTRACT(Messages, ClickAndChangeOfTextTellTheIdOfThatMoment) {
  std::string commands;
  RunDialog([&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message == kStep) {
      // The first has no SS_NOTIFY; the others have been renumbered.
      SetWindowLongA(Item(11), GWL_ID, 21);
      SetWindowLongA(Item(9), GWL_ID, 20);
      for (const int id : {9, 21, 20}) PostClick(Item(id));
      for (const int id : {10, 21}) SetWindowTextA(Item(id), "by program");
      SendMessageA(Item(10), EM_SETSEL, 0, -1);
      PostMessageA(dialog, kLastStep, 0, 0);
    }
    const int id = LOWORD(wParam), notice = HIWORD(wParam);
    const bool isOfFocus = id == 10 && notice < 0x300;
    if (message == WM_COMMAND && !isOfFocus) {
      commands += std::to_string(id) + '/' + std::to_string(notice) + ' ';
      Expect({reinterpret_cast<HWND>(lParam)}, {Item(id)});
      if (id == 21) Expect({SetFocus(Item(id))}, {Item(id)}, "the click has moved it");
    }
    if (message == kLastStep) EndDialog(dialog, 1);
    return FALSE;
  });
  Expect({commands}, {"10/1024 10/768 21/0 20/0 "});  // EN_UPDATE, EN_CHANGE
}

CONTRACT(Modal, BoxGivesTheButtonWhileTheDialogsStepsRun) {
  for (const int button : {IDNO, IDYES}) {
    RunAsking([button](HWND dialog) {
      AnswerNext(button);
      Expect({MessageBoxA(dialog, "Sure?", "Question", MB_YESNO | MB_DEFBUTTON2)}, {button});
    });
  }
  AnswerNext(IDOK);
  Expect({MessageBoxA(nullptr, nullptr, nullptr, MB_OK)}, {IDOK});
}

CONTRACT(Modal, PickerGivesAListOrNone) {
  // What is picked, or "none".
  const auto pick = [](HWND owner, int button, const char* folder) -> std::string {
    char name[MAX_PATH] = {}, path[MAX_PATH] = {};
    BROWSEINFOA browse = {};
    browse.hwndOwner = owner;
    browse.pszDisplayName = name;
    browse.lpszTitle = "Where?";
    AnswerNext(button, folder);
    const LPITEMIDLIST list = SHBrowseForFolderA(&browse);
    IMalloc* allocator = nullptr;
    Expect({SHGetPathFromIDListA(list, path), SHGetMalloc(&allocator)}, {list != nullptr, S_OK});
    allocator->Free(list);
    allocator->Release();
    return list != nullptr ? path : "none";
  };
  RunAsking([&](HWND dialog) { Expect({pick(dialog, IDOK, "C:\\contract")}, {"C:\\contract"}); });
  RunAsking([&](HWND dialog) { Expect({pick(dialog, IDCANCEL, "")}, {"none"}); });
}

}  // namespace contract

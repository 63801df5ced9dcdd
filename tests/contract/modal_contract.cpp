// Message boxes and the folder picker. Their texts are looked at by the scenarios.
#include "tests/contract/beyond_seam.h"
#include "tests/contract/standing_dialog.h"

namespace contract {
namespace {

// Runs `ask` in a dialog that has the focus on its first button. The step that was posted before it
// runs while the question stands, with the dialog disabled.
void RunAsking(const std::function<void(HWND dialog)>& ask, bool endsUnderIt) {
  bool isStepDone = false;
  const INT_PTR result = RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message == kStep) {
      const HWND button = GetDlgItem(dialog, 11);
      SetFocus(button);
      PostMessageA(dialog, kNextStep, 0, 0);
      ask(dialog);
      Expect(isStepDone, true);
      Expect(StyleOf(dialog) & WS_DISABLED, 0);
      if (endsUnderIt) return FALSE;
      Expect(SetFocus(button), button, "the focus has come back");
      EndDialog(dialog, 7);
    }
    if (message == kNextStep) {
      isStepDone = true;
      Expect(StyleOf(dialog) & WS_DISABLED, WS_DISABLED);
      if (endsUnderIt) EndDialog(dialog, 7);
    }
    return FALSE;
  });
  Expect(result, 7);
}

}  // namespace

CONTRACT(Modal, BoxGivesTheButtonWhileTheDialogsStepsRun) {
  constexpr UINT kQuestion = MB_YESNO | MB_ICONQUESTION | MB_DEFBUTTON2;
  for (const bool endsUnderIt : {false, true}) {
    for (const int button : {IDNO, IDYES}) {
      const auto ask = [button](HWND dialog) {
        AnswerNext(button);
        Expect(MessageBoxA(dialog, "Sure?", "Question", kQuestion), button);
      };
      RunAsking(ask, endsUnderIt);
    }
  }
  AnswerNext(IDOK);
  Expect(MessageBoxA(nullptr, nullptr, nullptr, MB_OK), IDOK);
}

CONTRACT(Modal, PickerGivesAListOrNone) {
  // What is picked, or "none".
  const auto pick = [](HWND owner, int button, const char* folder) -> std::string {
    char name[MAX_PATH] = {};
    BROWSEINFOA browse = {};
    browse.hwndOwner = owner;
    browse.pszDisplayName = name;
    browse.lpszTitle = "Where?";
    AnswerNext(button, folder);
    const LPITEMIDLIST list = SHBrowseForFolderA(&browse);
    char path[MAX_PATH] = {};
    Expect(SHGetPathFromIDListA(list, path), list != nullptr);
    IMalloc* allocator = nullptr;
    Expect(SHGetMalloc(&allocator), S_OK);
    allocator->Free(list);
    allocator->Release();
    return list != nullptr ? path : "none";
  };
  RunAsking([&](HWND dialog) { Expect(pick(dialog, IDOK, "C:\\contract"), "C:\\contract"); },
            false);
  RunAsking([&](HWND dialog) { Expect(pick(dialog, IDCANCEL, ""), "none"); }, false);
}

}  // namespace contract

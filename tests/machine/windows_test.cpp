// What a scripted user does to the dialog, and what this machine shows only of it. What it does
// anywhere is in tests/contract/, how boxes and steps go together in the scenarios.
#include "machine/windows.h"

#include "tests/support/test_dialog.h"

namespace {

class Windows : public DialogTest {
 protected:
  // Plays the script on a dialog with these controls, which command 2 or 3 ends; `prepare` runs at
  // its start. Returns the commands in their order, each as "ID/NOTIFICATION ".
  std::string Play(const std::vector<machine::TemplateItem>& controls, const std::string& script,
                   const std::function<void(HWND dialog)>& prepare = nullptr) {
    std::string seen;
    Run(controls, script, [&](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
      if (message == WM_INITDIALOG && prepare) prepare(dialog);
      if (message == WM_COMMAND) {
        seen += std::to_string(LOWORD(wParam)) + "/" + std::to_string(HIWORD(wParam)) + " ";
        if (LOWORD(wParam) == IDCANCEL || LOWORD(wParam) == 3) EndDialog(dialog, 1);
      }
      return FALSE;
    });
    return seen;
  }
};

TEST_F(Windows, OnlyADisabledButtonStopsEscapeAndCloseBox) {
  for (const std::string key : {"escape\n", "close\n"}) {
    EXPECT_EQ(Play({}, key), "2/0 ");
    EXPECT_EQ(Play({Control("Button", IDCANCEL)}, key,
                   [](HWND dialog) { ShowWindow(GetDlgItem(dialog, IDCANCEL), SW_HIDE); }),
              "2/0 ");
    EXPECT_EQ(Play({Control("Button", IDCANCEL), Control("Button", 3)}, key + "press 3\n",
                   [](HWND dialog) { EnableWindow(GetDlgItem(dialog, IDCANCEL), FALSE); }),
              "3/0 ");
  }
}

TEST_F(Windows, TypedTextIsToldOfAsAChange) {
  EXPECT_EQ(Play({Control("Edit", 10)}, "type 10 by \xC3\xA9 user \nshow 10\nescape\n"),
            "10/1024 10/768 2/0 ");
  EXPECT_EQ(shown, "10 Edit shown enabled \"by \xC3\xA9 user \"\n");
}

TEST_F(Windows, BoxAnsweredAtOnceDispatchesNothing) {
  constexpr UINT kStep = 1100;
  bool isAnswered = false;
  Run({}, "answer no\n", [&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message == WM_INITDIALOG) {
      PostMessageA(dialog, kStep, 0, 0);
      EXPECT_EQ(MessageBoxA(dialog, "?", "Q", MB_YESNO), IDNO);
      isAnswered = true;
    }
    if (message == kStep) {
      EXPECT_TRUE(isAnswered);
      EndDialog(dialog, 1);
    }
    return FALSE;
  });
}

TEST_F(Windows, OneDialogAtATimeOfKnownControls) {
  Play({}, "escape\n",
       [](HWND) { EXPECT_EQ(machine::RunDialog(machine::DialogTemplate(), nullptr, 0), -1); });
  EXPECT_EQ(Run({Control("ListBox", 10)}, "",
                [](HWND, UINT, WPARAM, LPARAM) -> INT_PTR { return FALSE; }),
            -1);
}

}  // namespace

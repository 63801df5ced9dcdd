// What a scripted user does to the dialog, and what this machine shows only of it. What it does
// anywhere is in tests/contract/.
#include "machine/windows.h"

#include "tests/support/test_dialog.h"

namespace {

using Order = std::vector<std::string>;

constexpr UINT kFirstStep = 1100;
constexpr UINT kSecondStep = 1101;
constexpr UINT kThirdStep = 1102;

// A handler that ends the dialog at its first message.
template <typename Check>
auto AtInit(Check check) {
  return [check](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
    if (message != WM_INITDIALOG) return FALSE;
    check(dialog, wParam, lParam);
    EndDialog(dialog, 5);
    return FALSE;
  };
}

class Windows : public DialogTest {};

// A box that is answered at once runs nothing; one that is answered late has run all that waited.
// The dialog is disabled under it.
TEST_F(Windows, BoxDispatchesWhatIsPostedWhileItIsOpen) {
  for (const bool late : {false, true}) {
    Order order;
    Run({}, late ? "answer-late no\n" : "answer no\n",
        [&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
          if (message == WM_INITDIALOG) PostMessageA(dialog, kFirstStep, 0, 0);
          if (message == kFirstStep) {
            PostMessageA(dialog, kSecondStep, 0, 0);
            order.push_back("asks");
            EXPECT_EQ(MessageBoxA(dialog, "?", "Q", MB_YESNO), IDNO);
            order.push_back("knows");
          }
          if (message == kSecondStep) {
            order.push_back("second step");
            EXPECT_EQ((GetWindowLongA(dialog, GWL_STYLE) & WS_DISABLED) != 0, late);
            PostMessageA(dialog, kThirdStep, 0, 0);
          }
          if (message == kThirdStep) {
            order.push_back("third step");
            EndDialog(dialog, 1);
          }
          return FALSE;
        });
    EXPECT_EQ(order, late ? (Order{"asks", "second step", "third step", "knows"})
                          : (Order{"asks", "knows", "second step", "third step"}));
    EXPECT_EQ(shown, "box \"Q\" \"?\" no\n");
  }
}

struct CommandSeen {
  int id;
  int notification;
  bool operator==(const CommandSeen&) const = default;
};

class Commands : public DialogTest {
 protected:
  // Plays the script on a dialog that command 2 ends. `prepare` runs at its start.
  std::vector<CommandSeen> Play(const std::vector<machine::TemplateItem>& controls,
                                const std::string& script,
                                const std::function<void(HWND)>& prepare = nullptr) {
    std::vector<CommandSeen> seen;
    Run(controls, script, [&](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
      if (message == WM_INITDIALOG && prepare) prepare(dialog);
      if (message == WM_COMMAND) {
        seen.push_back({LOWORD(wParam), HIWORD(wParam)});
        if (LOWORD(wParam) == IDCANCEL) EndDialog(dialog, 1);
      }
      return FALSE;
    });
    return seen;
  }
};

TEST_F(Commands, EscapeAndCloseBoxNeedNoControl) {
  for (const char* const key : {"escape\n", "close\n"}) {
    EXPECT_EQ(Play({}, key), (std::vector<CommandSeen>{{IDCANCEL, 0}}));
  }
  // A hidden button stops them as little; a disabled one does.
  const auto hide = [](HWND dialog) { ShowWindow(GetDlgItem(dialog, IDCANCEL), SW_HIDE); };
  EXPECT_EQ(Play({Control("Button", IDCANCEL)}, "escape\n", hide),
            (std::vector<CommandSeen>{{IDCANCEL, 0}}));
  const auto disable = [](HWND dialog) {
    EnableWindow(GetDlgItem(dialog, IDCANCEL), FALSE);
    PostMessageA(dialog, WM_COMMAND, IDCANCEL, 0);
  };
  EXPECT_EQ(Play({Control("Button", IDCANCEL)}, "", disable),
            (std::vector<CommandSeen>{{IDCANCEL, 0}}));
}

TEST_F(Commands, EditFieldTellsOfEveryChange) {
  const auto setText = [](HWND dialog) { SetWindowTextA(GetDlgItem(dialog, 10), "by program"); };
  EXPECT_EQ(Play({Control("Edit", 10)}, "type 10 by \xC3\xA9 user \nshow\nescape\n", setText),
            (std::vector<CommandSeen>{
                {10, 0x400}, {10, 0x300}, {10, 0x400}, {10, 0x300}, {IDCANCEL, 0}}));
  EXPECT_NE(shown.find("10 Edit shown enabled \"by \xC3\xA9 user \"\n"), std::string::npos)
      << shown;
}

TEST_F(Windows, OneDialogAtATimeOfKnownControls) {
  machine::DialogTemplate second;
  Run({}, "",
      AtInit([&](HWND, WPARAM, LPARAM) { EXPECT_EQ(machine::RunDialog(second, nullptr, 0), -1); }));
  EXPECT_EQ(Run({Control("ListBox", 10)}, "", AtInit([](HWND, WPARAM, LPARAM) { FAIL(); })), -1);
}

}  // namespace

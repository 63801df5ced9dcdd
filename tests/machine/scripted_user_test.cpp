// The user's script: what it may say, what it does to the dialog and prints, and what makes a run a
// failure; and what this machine alone shows of the controls that a program draws. What dialogs do
// anywhere is in tests/contract/, how boxes and steps go together in the scenarios.
#include "machine/scripted_user.h"

#include <gtest/gtest.h>

#include <functional>

#include "machine/dialog_template.h"
#include "machine/user_script.h"
#include "machine/windows.h"
#include "tests/support/test_machine.h"

namespace {

using testing::ExitedWithCode;

constexpr uint32_t kShownControl = 0x50010000;  // WS_CHILD | WS_VISIBLE | WS_TABSTOP
constexpr uint32_t kHiddenControl = kShownControl & ~uint32_t{WS_VISIBLE};
constexpr uint32_t kOwnerDrawnList = 0x13;  // CBS_DROPDOWNLIST | CBS_OWNERDRAWFIXED

machine::TemplateItem Control(const char* className, uint16_t id, uint32_t style = kShownControl,
                              const char* text = "") {
  return {
      .style = style, .width = 40, .height = 16, .id = id, .className = className, .text = text};
}

class ScriptedUser : public testing::Test {
 protected:
  using Controls = std::vector<machine::TemplateItem>;
  using Handler = std::function<void(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam)>;

  ~ScriptedUser() override { machine::ForgetUser(); }

  // Runs a dialog to its end. Returns its result; `shown` is what came on standard output.
  INT_PTR Run(const Controls& controls, const std::string& script, Handler handlerOfTest) {
    pc.Write("user.txt", script);
    std::string error;
    EXPECT_TRUE(machine::LoadUser(pc.Host("user.txt"), &error)) << error;
    machine::DialogTemplate dialog;
    dialog.frame.text = "Title";
    dialog.controls = controls;
    static Handler handler;
    handler = std::move(handlerOfTest);
    const auto callHandler = [](HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
      handler(window, message, wParam, lParam);
      return INT_PTR{FALSE};
    };
    if (captures) testing::internal::CaptureStdout();
    const INT_PTR result = machine::RunDialog(dialog, callHandler, 0);
    machine::EndUser();
    if (captures) shown = testing::internal::GetCapturedStdout();
    return result;
  }

  // Plays the script on a dialog that command 2 or 3 ends and whose button 10 asks a question.
  // Returns the commands in their order, each as "ID/NOTIFICATION ".
  std::string Play(const std::string& script, const Controls& controls = {Control("Button", 10)}) {
    std::string seen;
    Run(controls, script, [&seen](HWND dialog, UINT message, WPARAM wParam, LPARAM) {
      if (message != WM_COMMAND) return;
      seen += std::to_string(LOWORD(wParam)) + "/" + std::to_string(HIWORD(wParam)) + " ";
      if (wParam == 10) MessageBoxA(dialog, "Sure?", "Question", MB_YESNO);
      if (LOWORD(wParam) == IDCANCEL || LOWORD(wParam) == 3) EndDialog(dialog, 1);
    });
    return seen;
  }

  TestMachine pc;
  std::string shown;
  bool captures = true;  // not in a process that ends in between: its file would stay
};

TEST_F(ScriptedUser, BadLinesAreNamed) {
  const auto readError = [this](const std::string& script) {
    pc.Write("script", script);
    std::string error;
    EXPECT_FALSE(machine::ReadUserScript(pc.Host("script"), &error)) << script;
    return error;
  };
  const std::string path = pc.Host("script").string();
  EXPECT_EQ(readError("# a comment\n\n  wait\nsleep 5\n"),
            path + ":4: sleep 5: not a line of a user's script");
  for (const std::string line :
       {"wait now", "press", "press OK", "press 1 2", "press 1234567", "press -1", "type",
        "type some text", "answer", "answer maybe", "answer-late", "pick", "key", "at-poll wait",
        "at-poll 0 wait", "at-poll 1", "at-poll 1 answer yes", "at-poll 1 pick none", "Wait"}) {
    EXPECT_EQ(readError(line), path + ":1: " + line + ": not a line of a user's script");
  }
  std::string error;
  EXPECT_FALSE(machine::ReadUserScript(pc.Host("absent"), &error));
  EXPECT_EQ(error, pc.Host("absent").string() + ": can't be read");
}

TEST_F(ScriptedUser, ScriptThatDoesNotFitTheRunEndsTheProcess) {
  const Controls controls = {Control("Button", 10), Control("Button", 11, kHiddenControl),
                             Control("Button", 12, kShownControl | WS_DISABLED),
                             Control("Edit", 13)};
  const std::pair<const char*, const char*> rows[] = {
      {"wait\n", ": the script ends while the dialog is open"},
      {"escape\nwait\n", ":2: wait: left over"},
      {"answer no\nescape\n", ":1: answer no: left over"},
      {"pick none\nescape\n", ":1: pick none: left over"},
      {"escape\nclick-during 10\n", ":2: click-during 10: left over"},
      {"until-during Sure\nescape\n", ":1: until-during Sure: the step never said that"},
      {"click-during 99\nescape\n", ":1: click-during 99: there is no such control"},
      {"at-poll 1 escape\nescape\n", ":1: at-poll 1 escape: the run polled 0 times only"},
      {"press 10\n", ": no answer to box \"Question\" \"Sure\\?\""},
      {"press 99\n", ":1: press 99: no user could click"},
      {"press 11\n", ":1: press 11: no user could click"},
      {"press 12\n", ":1: press 12: no user could click"},
      {"type 11 text\n", ":1: type 11 text: no user could click"},
      {"keyboard \"text\"\n", ":1: keyboard \"text\": nothing that takes the key has"},
      {"type 10 text\n", ":1: type 10 text: not an edit field"},
  };
  captures = false;
  for (const auto& [script, message] : rows) {
    EXPECT_EXIT(Play(script, controls), ExitedWithCode(2), std::string("user.txt") + message);
  }
  machine::ForgetUser();
  EXPECT_EXIT(DialogBoxParamA(nullptr, MAKEINTRESOURCEA(116), nullptr, nullptr, 0),
              ExitedWithCode(2), "nobody can use the dialog");
}

TEST_F(ScriptedUser, ShowQuotesTextsAndTellsOfAListWithoutAChoice) {
  Play("show\ntype 13 by \xC3\xA9 user \nshow 13\nescape\n",
       {Control("Static", 901, 0x50000000, "\"\xE9\"\r\n\\"),
        Control("Button", 907, kShownControl | WS_DISABLED),
        Control("ComboBox", 918, kShownControl | kOwnerDrawnList), Control("Edit", 13)});
  EXPECT_EQ(shown,
            "dialog \"Title\" focus 918 default none\n"
            "901 Static shown enabled \"\\\"\xC3\xA9\\\"\\r\\n\\\\\"\n"
            "907 Button shown disabled \"\"\n"
            "918 ComboBox shown enabled none\n13 Edit shown enabled \"\"\n"
            "13 Edit shown enabled \"by \xC3\xA9 user \"\n");
}

TEST_F(ScriptedUser, OnlyADisabledButtonStopsEscapeAndCloseBox) {
  for (const std::string key : {"escape\n", "close\n"}) {
    EXPECT_EQ(Play(key), "2/0 ");
    EXPECT_EQ(Play(key, {Control("Button", IDCANCEL, kHiddenControl)}), "2/0 ");
    EXPECT_EQ(Play(key + "press 3\n", {Control("Button", IDCANCEL, kShownControl | WS_DISABLED),
                                       Control("Button", 3)}),
              "3/0 ");
  }
  EXPECT_EQ(Play("type 13 x\nescape\n", {Control("Edit", 13)}), "13/1024 13/768 2/0 ");
}

// Escape is a key of the dialog's own loop; the close box also works through a step's. A box that
// is answered at once dispatches nothing of what waits.
TEST_F(ScriptedUser, EscapeHasNoEffectOnAStepThatPolls) {
  std::string order;
  Run({Control("Button", 10)}, "at-poll 1 escape\nat-poll 2 close\nanswer no\npress 10\nescape\n",
      [&order](HWND dialog, UINT message, WPARAM wParam, LPARAM) {
        if (message != WM_COMMAND) return;
        order += std::to_string(LOWORD(wParam)) + ' ';
        if (LOWORD(wParam) == IDCANCEL && order.ends_with("77 2 ")) EndDialog(dialog, 1);
        if (LOWORD(wParam) != 10) return;
        for (int poll = 1; poll <= 2; ++poll) {
          order += "poll ";
          MSG posted = {};
          if (PeekMessageA(&posted, nullptr, 0, 0, PM_REMOVE) != FALSE) DispatchMessageA(&posted);
        }
        PostMessageA(dialog, WM_COMMAND, 77, 0);
        order += MessageBoxA(dialog, "?", "Q", MB_YESNO) == IDNO ? "no end " : "yes ";
      });
  EXPECT_EQ(order, "10 poll poll 2 no end 77 2 ");
}

TEST_F(ScriptedUser, OneDialogAtATimeOfKnownControls) {
  Run({}, "escape\n", [](HWND dialog, UINT message, WPARAM, LPARAM) {
    EXPECT_EQ(machine::RunDialog(machine::DialogTemplate(), nullptr, 0), -1);
    if (message == WM_COMMAND) EndDialog(dialog, 1);
  });
  EXPECT_EQ(Run({Control("ListBox", 10)}, "", nullptr), -1);
}

TEST_F(ScriptedUser, ControlsDrawThemselvesWhenTheyAreShownAndHaveChanged) {
  std::string drawings;
  const Controls controls = {Control("Static", 10, kShownControl | SS_OWNERDRAW),
                             Control("Button", 12),
                             Control("ComboBox", 11, kShownControl | kOwnerDrawnList)};
  Run(controls, "wait\nwait\npress 12\nwait\nescape\n",
      [&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
        const HWND text = GetDlgItem(dialog, 10);
        const HWND list = GetDlgItem(dialog, 11);
        if (message == WM_MEASUREITEM) {
          reinterpret_cast<MEASUREITEMSTRUCT*>(lParam)->itemHeight = 19;
        }
        if (message == WM_INITDIALOG) SendMessageA(list, CB_ADDSTRING, 0, 900);
        if (message == WM_DRAWITEM) {
          const auto& item = *reinterpret_cast<const DRAWITEMSTRUCT*>(lParam);
          drawings += std::to_string(item.CtlID) + ": " + std::to_string(item.itemData) + " high " +
                      std::to_string(item.rcItem.bottom) +
                      ((item.itemState & (ODS_SELECTED | ODS_FOCUS)) != 0 ? " focus; " : "; ");
        }
        if (message == WM_COMMAND && LOWORD(wParam) == 12) {
          SetWindowTextA(text, "changed");
          SetFocus(list);
          SendMessageA(list, CB_SETCURSEL, 0, 0);
        }
        if (message == WM_COMMAND && LOWORD(wParam) == IDCANCEL) {
          ShowWindow(text, SW_HIDE);
          SetWindowTextA(text, "hidden");
          EndDialog(dialog, 1);
        }
      });
  EXPECT_EQ(drawings, "10: 0 high 26; 11: 0 high 19; 10: 0 high 26; 11: 900 high 19 focus; ");
}

}  // namespace

// The user's script: what it may say, what it prints, and what makes a run a failure.
#include "machine/scripted_user.h"

#include "machine/open_objects.h"
#include "machine/user_script.h"
#include "tests/support/test_dialog.h"

namespace {

using testing::ExitedWithCode;

class ScriptedUser : public DialogTest {
 protected:
  ScriptedUser() { GTEST_FLAG_SET(death_test_style, "threadsafe"); }
  ~ScriptedUser() override { machine::ForgetUser(); }

  std::string ReadError(const std::string& script) {
    pc.Write("script", script);
    std::string error;
    EXPECT_FALSE(machine::ReadUserScript(pc.Host("script"), &error)) << script;
    const std::string path = pc.Host("script").string();
    EXPECT_EQ(error.substr(0, path.size()), path);
    return error.substr(std::min(error.size(), path.size()));
  }

  // A dialog that command 2 ends and whose button 10 asks a question.
  void Play(const std::string& script) {
    Run({Control("Button", 10), Control("Button", 11, kShownControl & ~0x10000000u),
         Control("Button", 12, kShownControl | WS_DISABLED), Control("Edit", 13)},
        script, [](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
          if (message != WM_COMMAND) return FALSE;
          if (LOWORD(wParam) == 10) MessageBoxA(dialog, "Sure?", "Question", MB_YESNO);
          if (LOWORD(wParam) == IDCANCEL) EndDialog(dialog, 1);
          return FALSE;
        });
  }
};

TEST_F(ScriptedUser, BadLinesAreNamed) {
  EXPECT_EQ(ReadError("# a comment\n\n  wait\nsleep 5\n"),
            ":4: sleep 5: not a line of a user's script");
  for (const char* const line :
       {"wait now", "press", "press OK", "press 1 2", "press 1234567", "press -1", "type",
        "type some text", "answer", "answer maybe", "answer-late", "pick", "key", "at-poll wait",
        "at-poll 0 wait", "at-poll 1", "at-poll 1 answer yes", "at-poll 1 pick none", "Wait"}) {
    EXPECT_EQ(ReadError(line), std::string(":1: ") + line + ": not a line of a user's script");
  }
  std::string error;
  EXPECT_FALSE(machine::ReadUserScript(pc.Host("absent"), &error));
  EXPECT_EQ(error, pc.Host("absent").string() + ": can't be read");
}

TEST_F(ScriptedUser, ScriptThatDoesNotFitTheRunEndsTheProcess) {
  const struct {
    const char* script;
    const char* message;
  } rows[] = {
      {"wait\n", "user.txt: the script ends while the dialog is open"},
      {"escape\nwait\n", "user.txt:2: wait: left over"},
      {"answer no\nescape\n", "user.txt:1: answer no: left over"},
      {"pick none\nescape\n", "user.txt:1: pick none: left over"},
      {"escape\nclick-during 10\n", "user.txt:2: click-during 10: left over"},
      {"until-during Sure\nescape\n", "user.txt:1: until-during Sure: the step never said that"},
      {"click-during 99\nescape\n", "user.txt:1: click-during 99: there is no such control"},
      {"at-poll 1 escape\nescape\n", "user.txt:1: at-poll 1 escape: the run polled 0 times only"},
      {"press 10\n", "user.txt: no answer to box \"Question\" \"Sure\\?\""},
      {"press 99\n", "user.txt:1: press 99: no user could click"},
      {"press 11\n", "user.txt:1: press 11: no user could click"},
      {"press 12\n", "user.txt:1: press 12: no user could click"},
      {"type 11 text\n", "user.txt:1: type 11 text: no user could click"},
      {"keyboard \"text\"\n", "user.txt:1: keyboard \"text\": nothing that takes the key has"},
      {"type 10 text\n", "user.txt:1: type 10 text: not an edit field"},
  };
  for (const auto& row : rows) EXPECT_EXIT(Play(row.script), ExitedWithCode(2), row.message);
}

TEST_F(ScriptedUser, DialogNeedsSomebody) {
  machine::ForgetUser();
  const auto open = [] {
    DialogBoxParamA(
        nullptr, MAKEINTRESOURCEA(116), nullptr,
        [](HWND, UINT, WPARAM, LPARAM) -> INT_PTR { std::abort(); }, 0);
  };
  EXPECT_EXIT(open(), ExitedWithCode(2), "nobody can use the dialog");
}

TEST_F(ScriptedUser, ShowQuotesTextsAndTellsOfAListWithoutAChoice) {
  Run({Control("Static", 901, 0x50000000, "\"\xE9\"\r\n\\"),
       Control("ComboBox", 918, kShownControl | kOwnerDrawnList), Control("Button", 907)},
      "press 907\nshow\nescape\n", [](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
        if (message == WM_COMMAND && LOWORD(wParam) == 907) DestroyWindow(GetDlgItem(dialog, 907));
        if (message == WM_COMMAND && LOWORD(wParam) == IDCANCEL) EndDialog(dialog, 1);
        return FALSE;
      });
  EXPECT_EQ(shown,
            "dialog \"Title\" focus 918 default none\n"
            "901 Static shown enabled \"\\\"\xC3\xA9\\\"\\r\\n\\\\\"\n"
            "918 ComboBox shown enabled none\n");
}

// Escape is a key of the dialog's own loop; the close box also works through a step's.
TEST_F(ScriptedUser, EscapeHasNoEffectOnAStepThatPolls) {
  std::string order;
  Run({Control("Button", 10)}, "at-poll 1 escape\nat-poll 2 close\npress 10\nescape\n",
      [&order](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
        if (message != WM_COMMAND) return FALSE;
        order += std::to_string(LOWORD(wParam)) + ' ';
        if (LOWORD(wParam) == IDCANCEL && order.ends_with("end 2 ")) EndDialog(dialog, 1);
        if (LOWORD(wParam) != 10) return FALSE;
        for (int poll = 1; poll <= 2; ++poll) {
          order += "poll ";
          MSG posted = {};
          if (PeekMessageA(&posted, nullptr, 0, 0, PM_REMOVE) != FALSE) DispatchMessageA(&posted);
        }
        order += "end ";
        return FALSE;
      });
  EXPECT_EQ(order, "10 poll poll 2 end 2 ");
}

TEST_F(ScriptedUser, StartedProcessLeavesTwoHandlesToClose) {
  pc.Write("drive_c/browser.exe", "");
  char command[] = "C:\\browser.exe";
  STARTUPINFOA startup = {};
  PROCESS_INFORMATION process = {};
  const auto start = [&] {
    return CreateProcessA(nullptr, command, nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                          &process);
  };
  EXPECT_EQ(start(), FALSE);  // the record doesn't tell its size
  startup.cb = sizeof(startup);
  EXPECT_EQ(start(), TRUE);
  EXPECT_EQ(machine::OpenObjects(), "2 process handles");
  EXPECT_EQ(CloseHandle(process.hProcess), TRUE);
  EXPECT_EQ(CloseHandle(process.hThread), TRUE);
}

}  // namespace

// The user's script: what it may say, what it prints, and what makes a run a failure.
#include "machine/scripted_user.h"

#include "machine/open_objects.h"
#include "machine/registry_store.h"
#include "machine/user_script.h"
#include "tests/support/test_dialog.h"

namespace {

using testing::ExitedWithCode;

constexpr UINT kStep = 1100;

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

TEST_F(ScriptedUser, ShowPrintsEveryControlInTabOrder) {
  machine::TemplateItem picture = Control("Static", 65535, 0x5000010E);
  picture.pictureId = 118;
  Run({picture, Control("Static", 901, 0x50000000, "\"\xE9\"\r\n\\"),
       Control("ComboBox", 917, kShownControl | kOwnerDrawnList | WS_DISABLED),
       Control("ComboBox", 918, kShownControl | kOwnerDrawnList), Control("Button", 907),
       Control("Button", 2, kShownControl | BS_DEFPUSHBUTTON), Control("Button", 3)},
      "show\npress 3\nshow\nescape\n",
      [](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
        if (message == WM_INITDIALOG) {
          for (const LPARAM item : {100, 200}) {
            SendMessageA(GetDlgItem(dialog, 917), CB_ADDSTRING, 0, item);
          }
          SendMessageA(GetDlgItem(dialog, 917), CB_SETCURSEL, 1, 0);
          ShowWindow(GetDlgItem(dialog, 907), SW_HIDE);
          SetFocus(GetDlgItem(dialog, 2));
        }
        if (message == WM_COMMAND && LOWORD(wParam) == 3) {
          ShowWindow(GetDlgItem(dialog, 2), SW_HIDE);
          EnableWindow(GetDlgItem(dialog, 3), FALSE);
          DestroyWindow(GetDlgItem(dialog, 901));
        }
        if (message == WM_COMMAND && LOWORD(wParam) == 2) EndDialog(dialog, 1);
        return FALSE;
      });
  EXPECT_EQ(shown,
            "dialog \"Title\" focus 2 default 2\n"
            "65535 Static shown enabled \"\"\n"
            "901 Static shown enabled \"\\\"\xC3\xA9\\\"\\r\\n\\\\\"\n"
            "917 ComboBox shown disabled selected 1 of 2\n"
            "918 ComboBox shown enabled none\n"
            "907 Button hidden enabled \"\"\n"
            "2 Button shown enabled \"\"\n"
            "3 Button shown enabled \"\"\n"
            "dialog \"Title\" focus none default none\n"
            "65535 Static shown enabled \"\"\n"
            "917 ComboBox shown disabled selected 1 of 2\n"
            "918 ComboBox shown enabled none\n"
            "907 Button hidden enabled \"\"\n"
            "2 Button hidden enabled \"\"\n"
            "3 Button shown disabled \"\"\n");
}

TEST_F(ScriptedUser, AnswersAreTakenInTheirOrder) {
  Play("answer yes\npress 10\npress 10\nanswer no\nescape\n");
  EXPECT_EQ(shown, "box \"Question\" \"Sure?\" yes\nbox \"Question\" \"Sure?\" no\n");
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

// A pass of five polls, started by button 10, in the handler itself or in a step that it posts.
class UserDuringAPass : public ScriptedUser {
 protected:
  std::vector<std::string> PlayPass(const std::string& script, bool isPosted) {
    std::vector<std::string> order;
    bool isDone = false;
    const auto poll = [&] {
      for (int count = 1; count <= 5; ++count) {
        order.push_back("poll " + std::to_string(count));
        SetWindowTextA(GetDlgItem(machine::OpenDialog()->frame.handle, 11), order.back().c_str());
        MSG message = {};
        if (PeekMessageA(&message, nullptr, 0, 0, PM_REMOVE) != FALSE) DispatchMessageA(&message);
      }
      isDone = true;
    };
    Run({Control("Button", 10), Control("Button", 11)}, script,
        [&](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
          const bool isCommand = message == WM_COMMAND;
          if (isCommand) order.push_back("command " + std::to_string(LOWORD(wParam)));
          if (isCommand && LOWORD(wParam) == 10 && isPosted) PostMessageA(dialog, kStep, 0, 0);
          if ((isCommand && LOWORD(wParam) == 10 && !isPosted) || message == kStep) poll();
          if (isCommand && LOWORD(wParam) == IDCANCEL && isDone) EndDialog(dialog, 1);
          return FALSE;
        });
    return order;
  }
};

TEST_F(UserDuringAPass, ClickIsMetByTheFirstPoll) {
  for (const bool isPosted : {false, true}) {
    EXPECT_EQ(PlayPass("press 10\nclick-during 11\nescape\n", isPosted),
              (std::vector<std::string>{"command 10", "poll 1", "command 11", "poll 2", "poll 3",
                                        "poll 4", "poll 5", "command 2"}))
        << isPosted;
  }
}

TEST_F(UserDuringAPass, LineIsDoneAtItsPoll) {
  // Escape is a key of the dialog's own loop; the close box also works through the pass's.
  EXPECT_EQ(
      PlayPass("at-poll 2 escape\nat-poll 3 close\nat-poll 4 press 11\npress 10\nescape\n", false),
      (std::vector<std::string>{"command 10", "poll 1", "poll 2", "poll 3", "command 2", "poll 4",
                                "command 11", "poll 5", "command 2"}));
}

TEST_F(UserDuringAPass, LinesWaitUntilTheStepSaysSomething) {
  // The third poll shows the text; the close box behind it is met at once.
  EXPECT_EQ(PlayPass("press 10\nuntil-during poll 3\nclose-during\nescape\n", true),
            (std::vector<std::string>{"command 10", "poll 1", "poll 2", "poll 3", "command 2",
                                      "poll 4", "poll 5", "command 2"}));
}

TEST_F(UserDuringAPass, KeyIsMadeInTheRegistry) {
  PlayPass("at-poll 2 key SOFTWARE\\A\\B\npress 10\nkey SOFTWARE\\C\nescape\n", false);
  for (const char* const path : {"SOFTWARE\\A\\B", "SOFTWARE\\C"}) {
    EXPECT_NE(machine::FindKey(machine::LocalMachine(), path), nullptr) << path;
  }
}

class Shell : public ScriptedUser {
 protected:
  // What the dialog does at its start, with the script as its user, who then presses Escape.
  void Do(const std::string& script, const std::function<void(HWND)>& action) {
    Run({}, script + "escape\n", [&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
      if (message == WM_INITDIALOG) action(dialog);
      if (message == WM_COMMAND) EndDialog(dialog, 1);
      return FALSE;
    });
  }
};

TEST_F(Shell, PickerGivesAListThatIsGivenBack) {
  Do("pick C:\\\xC3\xA9t\xC3\xA9\npick none\n", [](HWND dialog) {
    BROWSEINFOA browse = {};
    browse.hwndOwner = dialog;
    browse.lpszTitle = "Where?";
    const LPITEMIDLIST list = SHBrowseForFolderA(&browse);
    char path[MAX_PATH] = {};
    EXPECT_EQ(SHGetPathFromIDListA(list, path), TRUE);
    EXPECT_STREQ(path, "C:\\\xE9t\xE9");
    EXPECT_EQ(machine::OpenObjects(), "1 item list");
    IMalloc* allocator = nullptr;
    ASSERT_EQ(SHGetMalloc(&allocator), S_OK);
    allocator->Free(list);
    allocator->Release();
    EXPECT_EQ(machine::OpenObjects(), "");
    EXPECT_EQ(SHBrowseForFolderA(&browse), nullptr);
  });
  EXPECT_EQ(shown, "picker \"Where?\" C:\\\xC3\xA9t\xC3\xA9\npicker \"Where?\" none\n");
}

TEST_F(Shell, StartedProcessLeavesTwoHandlesToClose) {
  Do("", [](HWND dialog) {
    char command[] = "browser.exe \"x\"";
    STARTUPINFOA startup = {};
    PROCESS_INFORMATION process = {};
    const auto start = [&] {
      return CreateProcessA(nullptr, command, nullptr, nullptr, FALSE, 0, nullptr, nullptr,
                            &startup, &process);
    };
    EXPECT_EQ(start(), FALSE);  // the record doesn't tell its size
    startup.cb = sizeof(startup);
    EXPECT_EQ(start(), TRUE);
    EXPECT_EQ(machine::OpenObjects(), "2 process handles");
    EXPECT_EQ(CloseHandle(process.hProcess), TRUE);
    EXPECT_EQ(CloseHandle(process.hThread), TRUE);
    EXPECT_EQ(CloseHandle(process.hThread), FALSE);
    ShellExecuteA(dialog, "Open", "C:\\windows\\a.txt", nullptr, nullptr, SW_SHOW);
    MessageBeep(MB_ICONEXCLAMATION);
  });
  EXPECT_EQ(shown, "start \"browser.exe \\\"x\\\"\"\nopen \"C:\\\\windows\\\\a.txt\"\nbeep 48\n");
}

}  // namespace

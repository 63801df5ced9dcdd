// The dialog of the stand-in machine: look-ups, styles, messages, clicks, focus.
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

TEST_F(Windows, LookUpsFollowRenumberingInTabOrder) {
  const auto check = [](HWND dialog, WPARAM, LPARAM) {
    const HWND first = GetDlgItem(dialog, 10);
    const HWND second = GetDlgItem(dialog, 11);
    EXPECT_EQ(SetWindowLongA(first, GWL_ID, 11), 10);
    EXPECT_EQ(GetDlgItem(dialog, 10), nullptr);
    EXPECT_EQ(GetDlgItem(dialog, 11), first);
    EXPECT_EQ(GetWindowLongA(first, GWL_ID), 11);

    EXPECT_EQ(DestroyWindow(first), TRUE);
    EXPECT_EQ(IsWindow(first), FALSE);
    EXPECT_EQ(GetDlgItem(dialog, 11), second);
    EXPECT_EQ(DestroyWindow(first), FALSE);
    EXPECT_EQ(SetWindowLongA(first, GWL_ID, 12), 0);
    EXPECT_EQ(SetWindowLongA(nullptr, GWL_ID, 12), 0);
    EXPECT_EQ(IsWindow(nullptr), FALSE);
    EXPECT_EQ(GetDlgItem(nullptr, 11), nullptr);
  };
  EXPECT_EQ(Run({Control("Button", 10), Control("Button", 11)}, "", AtInit(check)), 5);
}

TEST_F(Windows, StyleTellsAndSetsTheState) {
  const auto check = [](HWND dialog, WPARAM, LPARAM) {
    const HWND button = GetDlgItem(dialog, 10);
    const auto style = [button] {
      return static_cast<uint32_t>(GetWindowLongA(button, GWL_STYLE));
    };
    EXPECT_EQ(style(), kShownControl);
    EXPECT_EQ(ShowWindow(button, SW_HIDE), TRUE);
    EXPECT_EQ(ShowWindow(button, SW_HIDE), FALSE);
    EXPECT_EQ(EnableWindow(button, FALSE), FALSE);
    EXPECT_EQ(EnableWindow(button, FALSE), TRUE);
    EXPECT_EQ(style(), (kShownControl & ~0x10000000u) | 0x08000000u);
    SetWindowLongA(button, GWL_STYLE, static_cast<LONG>(kShownControl | 0xB00));
    // The type is the low four bits; the others stay.
    SendMessageA(button, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    EXPECT_EQ(style(), kShownControl | 0xB01);
    const HWND text = GetDlgItem(dialog, 11);
    SendMessageA(text, BM_SETSTYLE, BS_DEFPUSHBUTTON, TRUE);
    EXPECT_EQ(static_cast<uint32_t>(GetWindowLongA(text, GWL_STYLE)), kShownControl);
  };
  Run({Control("Button", 10), Control("Static", 11)}, "", AtInit(check));
}

TEST_F(Windows, TextsAreCutToTheBuffer) {
  const auto check = [](HWND dialog, WPARAM, LPARAM) {
    char buffer[8] = "before";
    const auto read = [&](HWND window, WPARAM size) {
      return SendMessageA(window, WM_GETTEXT, size, reinterpret_cast<LPARAM>(buffer));
    };
    const HWND edit = GetDlgItem(dialog, 10);
    SetWindowTextA(edit, "abcdef");
    EXPECT_EQ(read(edit, 4), 3);
    EXPECT_STREQ(buffer, "abc");
    EXPECT_EQ(read(edit, sizeof(buffer)), 6);
    EXPECT_EQ(read(edit, 0), 0);
    EXPECT_EQ(read(dialog, sizeof(buffer)), 5);
    EXPECT_STREQ(buffer, "Title");
  };
  Run({Control("Edit", 10)}, "", AtInit(check));
}

TEST_F(Windows, PostedMessagesComeInTheirOrderAndNeverInsideTheCall) {
  std::vector<UINT> order;
  Run({}, "", [&](HWND dialog, UINT message, WPARAM wParam, LPARAM) -> INT_PTR {
    order.push_back(message);
    if (message == WM_INITDIALOG) {
      PostMessageA(dialog, kFirstStep, 1, 0);
      PostMessageA(dialog, kSecondStep, 2, 0);
      order.push_back(0);
    } else if (message == kFirstStep) {
      EXPECT_EQ(wParam, 1u);
      PostMessageA(dialog, kThirdStep, 3, 0);
    } else if (message == kThirdStep) {
      EndDialog(dialog, 1);
      PostMessageA(dialog, kFirstStep, 1, 0);  // too late: the loop has ended
    }
    return FALSE;
  });
  EXPECT_EQ(order, (std::vector<UINT>{WM_INITDIALOG, 0, kFirstStep, kSecondStep, kThirdStep}));
}

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

TEST_F(Windows, EndInsideANestedHandlerWaitsForTheOuterOne) {
  bool isOuterDone = false;
  const INT_PTR result =
      Run({Control("Button", 10)}, "", [&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
        EXPECT_FALSE(isOuterDone) << message;
        if (message == WM_INITDIALOG) PostMessageA(dialog, kFirstStep, 0, 0);
        if (message == kFirstStep) {
          PostMessageA(dialog, kSecondStep, 0, 0);
          PostMessageA(dialog, kThirdStep, 0, 0);
          MSG next = {};
          EXPECT_EQ(PeekMessageA(&next, nullptr, 0, 0, PM_REMOVE), TRUE);
          DispatchMessageA(&next);
          EXPECT_NE(GetDlgItem(dialog, 10), nullptr);  // it stands until its loop ends
          isOuterDone = true;
        }
        if (message == kSecondStep) EndDialog(dialog, 7);
        return FALSE;
      });
  EXPECT_TRUE(isOuterDone);
  EXPECT_EQ(result, 7);
  EXPECT_EQ(machine::OpenDialog(), nullptr);
}

TEST_F(Windows, OwnerDrawnListIsMeasuredFirstAndEmptiedLast) {
  Order order;
  int items[2] = {};
  Run({Control("Button", 10), Control("ComboBox", 11, kShownControl | kOwnerDrawnList)}, "",
      [&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) -> INT_PTR {
        if (message == WM_MEASUREITEM) {
          EXPECT_EQ(wParam, 11u);
          EXPECT_EQ(reinterpret_cast<const MEASUREITEMSTRUCT*>(lParam)->CtlID, 11u);
          order.push_back("measure");
        } else if (message == WM_INITDIALOG) {
          order.push_back("init");
          const HWND list = GetDlgItem(dialog, 11);
          for (int& item : items) {
            SendMessageA(list, CB_ADDSTRING, 0, reinterpret_cast<LPARAM>(&item));
          }
          EndDialog(dialog, 1);
        } else if (message == WM_DELETEITEM) {
          const auto& deleted = *reinterpret_cast<const DELETEITEMSTRUCT*>(lParam);
          EXPECT_EQ(deleted.itemData, reinterpret_cast<ULONG_PTR>(&items[deleted.itemID]));
          EXPECT_NE(IsWindow(deleted.hwndItem), FALSE);
          order.push_back("delete " + std::to_string(deleted.itemID));
        }
        return FALSE;
      });
  EXPECT_EQ(order, (Order{"measure", "init", "delete 0", "delete 1"}));
}

TEST_F(Windows, ListGivesBackWhatItWasGiven) {
  const auto check = [](HWND dialog, WPARAM, LPARAM) {
    const HWND list = GetDlgItem(dialog, 11);
    const auto send = [list](UINT message, WPARAM wParam, LPARAM lParam = 0) {
      return SendMessageA(list, message, wParam, lParam);
    };
    EXPECT_EQ(send(CB_GETCURSEL, 0), CB_ERR);
    EXPECT_EQ(send(CB_GETITEMDATA, 0), CB_ERR);
    EXPECT_EQ(send(CB_ADDSTRING, 0, 1000), 0);
    EXPECT_EQ(send(CB_ADDSTRING, 0, 900), 1);  // not sorted
    EXPECT_EQ(send(CB_GETCOUNT, 0), 2);
    EXPECT_EQ(send(CB_GETITEMDATA, 1), 900);
    EXPECT_EQ(send(CB_SETCURSEL, 1), 1);
    EXPECT_EQ(send(CB_SETCURSEL, 2), CB_ERR);
    EXPECT_EQ(send(CB_GETCURSEL, 0), CB_ERR);
    EXPECT_EQ(send(CB_SETITEMDATA, 2), CB_ERR);
    EXPECT_NE(send(CB_SETITEMDATA, 0, 5), CB_ERR);
    EXPECT_EQ(send(CB_GETITEMDATA, 0), 5);
    EXPECT_EQ(SendMessageA(nullptr, CB_GETCOUNT, 0, 0), 0);
  };
  Run({Control("ComboBox", 11, kShownControl | kOwnerDrawnList)}, "", AtInit(check));
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

TEST_F(Commands, ClickGivesTheIdOfThatMoment) {
  const auto renumber = [](HWND dialog) { SetWindowLongA(GetDlgItem(dialog, 10), GWL_ID, 20); };
  EXPECT_EQ(Play({Control("Button", 10), Control("Static", 11, kShownControl | kNotify),
                  Control("Static", 12)},
                 "press 20\npress 11\npress 12\nescape\n", renumber),
            (std::vector<CommandSeen>{{20, 0}, {11, STN_CLICKED}, {IDCANCEL, 0}}));
}

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

class Focus : public DialogTest {
 protected:
  // The id of the control that has the focus; 0 for none.
  static int Focused() {
    const machine::Window* const control =
        machine::FindWindowByHandle(machine::OpenDialog()->focus);
    return control != nullptr ? control->id : 0;
  }

  static constexpr uint32_t kNoTabStop = kShownControl & ~0x10000u;
  const std::vector<machine::TemplateItem> controls = {Control("Static", 9, kNoTabStop),
                                                       Control("Edit", 10), Control("Button", 11),
                                                       Control("Button", 12)};
};

TEST_F(Focus, FirstTabStopGetsItUnlessTheProgramHasSetIt) {
  for (const bool systemSets : {false, true}) {
    for (const bool programSets : {false, true}) {
      Run(controls, "press 12\n", [&](HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
        if (message == WM_INITDIALOG) {
          EXPECT_EQ(wParam, reinterpret_cast<WPARAM>(GetDlgItem(dialog, 10)));
          EXPECT_EQ(lParam, kData);
          if (programSets) SetFocus(GetDlgItem(dialog, 11));
          PostMessageA(dialog, kFirstStep, 0, 0);
        }
        if (message == kFirstStep) {
          EXPECT_EQ(Focused(), programSets && !systemSets ? 11 : 10);
        }
        if (message == WM_COMMAND) {
          EXPECT_EQ(Focused(), 12);  // the click has moved it
          EndDialog(dialog, 1);
        }
        return INT_PTR{message == WM_INITDIALOG && systemSets};
      });
    }
  }
}

TEST_F(Focus, ControlThatGoesPassesItOn) {
  const auto check = [](HWND dialog, WPARAM, LPARAM) {
    const HWND edit = GetDlgItem(dialog, 10);
    EXPECT_EQ(SetFocus(edit), nullptr);
    EXPECT_EQ(SetFocus(GetDlgItem(dialog, 12)), edit);
    DestroyWindow(GetDlgItem(dialog, 12));
    EXPECT_EQ(Focused(), 10);
    ShowWindow(edit, SW_HIDE);
    EXPECT_EQ(Focused(), 11);
    ShowWindow(edit, SW_SHOW);
    EXPECT_EQ(Focused(), 11);
    // A disabled control keeps nothing and gets nothing.
    EnableWindow(GetDlgItem(dialog, 11), FALSE);
    EXPECT_EQ(Focused(), 0);
    EXPECT_EQ(SetFocus(GetDlgItem(dialog, 11)), nullptr);
    EXPECT_EQ(Focused(), 0);
    SetFocus(dialog);
    EXPECT_EQ(Focused(), 10);
    SetFocus(nullptr);
    EXPECT_EQ(Focused(), 0);
  };
  Run(controls, "", AtInit(check));
}

TEST_F(Windows, OneDialogAtATimeOfKnownControls) {
  machine::DialogTemplate second;
  Run({}, "",
      AtInit([&](HWND, WPARAM, LPARAM) { EXPECT_EQ(machine::RunDialog(second, nullptr, 0), -1); }));
  EXPECT_EQ(Run({Control("ListBox", 10)}, "", AtInit([](HWND, WPARAM, LPARAM) { FAIL(); })), -1);
}

}  // namespace

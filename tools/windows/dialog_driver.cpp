// Plays a user's script on the real window of the setup program, and prints what that user sees:
// the same lines that the stand-in machine prints for the same script (docs/stand-in-machine.md).
//
//   dialog_driver SCRIPT OUTPUT PROGRAM ARGUMENTS
//
// SCRIPT and OUTPUT have no blanks; all that stands behind them is the program's command line, as
// it is. OUTPUT is a file, made anew, in UTF-8; its last line is "exit code: N", or one that begins
// with "failed: " when the script doesn't fit the run.
//
// "at-poll" is the stand-in's alone, and of what "show-drawn" prints all but the "seen" lines. A
// line that begins a step and the lines "...-during" behind it reach the program's queue while its
// thread stands still, so that nothing comes between them. "until-during TEXT" lets it run until
// the message area has this text: what follows meets the pass's next polls. "until-file PATH" waits
// for a file that another program writes. Three lines more are for tools/screenshots: "picture
// NAME" prints itself and waits until the file OUTPUT.NAME is there; "picture-during NAME" does so
// at once behind the line before it, "picture-box NAME" when the next box stands.
#include <windows.h>
// After windows.h.
#include <algorithm>
#include <cstdlib>
#include <deque>
#include <fstream>
#include <string>
#include <vector>

#include "tools/windows/dialog_view.h"
#include "tools/windows/driven_program.h"
#include "tools/windows/modal_answers.h"
#include "tools/windows/screen_pixels.h"
#include "tools/windows/user_input.h"

namespace {

constexpr int kStableLooks = 4;  // a page that has not changed for so many looks stands

std::deque<Line> script;
ModalAnswers answers;

// The whole dialog, or the line of the one control that bears the id.
void Show(HWND dialog, const std::string& id = "") {
  for (const std::string& line : DescribeDialog(dialog)) {
    if (id.empty() || line.starts_with(id + " ")) Print(line);
  }
}

// The dialog when a page of it stands and nothing moves; null when the program has ended. Answers
// boxes and pickers on the way.
HWND WaitForPage() {
  std::vector<std::string> before;
  int same = 0;
  for (int look = 0; look < kMostLooks; ++look) {
    if (HasEnded()) return nullptr;
    const ProgramWindows windows = FindWindows(DrivenProcess().dwProcessId);
    if (windows.modal != nullptr) {
      AnswerModal(windows, &answers);
      same = 0;
    } else if (windows.dialog != nullptr && IsPage(windows.dialog)) {
      const std::vector<std::string> now = DescribeDialog(windows.dialog);
      same = now == before ? same + 1 : 0;
      before = now;
      if (same >= kStableLooks) return windows.dialog;
    }
    Sleep(kStepTime);
  }
  Fail("the dialog never waits for its user");
}

void WaitForMessage(HWND dialog, const std::wstring& text) {
  for (int look = 0; look < kMostLooks && !HasEnded(); ++look) {
    if (ReadMessageArea(dialog).find(text) != std::wstring::npos) return;
    Sleep(1);
  }
  Show(dialog);
  Fail("the message area never had the text");
}

// Another program, which the dialog has started, writes it.
void WaitForFile(const std::string& path) {
  for (int look = 0; look < kMostLooks; ++look) {
    WIN32_FILE_ATTRIBUTE_DATA file = {};
    if (GetFileAttributesExA(path.c_str(), GetFileExInfoStandard, &file) && file.nFileSizeLow > 0) {
      return;
    }
    Sleep(kStepTime);
  }
  Fail("nobody wrote " + path);
}

HWND Existing(HWND dialog, const std::string& id) {
  const HWND control = GetDlgItem(dialog, std::atoi(id.c_str()));
  if (control == nullptr) Fail("there is no control " + id);
  return control;
}

HWND Clickable(HWND dialog, const std::string& id) {
  const HWND control = GetDlgItem(dialog, std::atoi(id.c_str()));
  if (control == nullptr || !IsShown(control) || !IsWindowEnabled(control)) {
    Show(dialog);
    Fail("no user could click on " + id);
  }
  return control;
}

void RequireFocusOn(HWND dialog, const char* className) {
  const HWND focus = FocusOf(dialog);
  if (focus == nullptr || ClassOf(focus) != className) {
    Fail("nothing that takes the key has the focus");
  }
}

void UseKeyboard(HWND dialog, const std::string& key) {
  if (key.starts_with('"')) {
    RequireFocusOn(dialog, "Edit");
    TypeKeys(Wide(key.substr(1, key.size() - 2)));
  } else if (key == "SPACE") {
    RequireFocusOn(dialog, "Button");
    PressKey(VK_SPACE);
  } else if (key == "ENTER") {
    PressKey(VK_RETURN);
  } else {
    PressKey(VK_TAB, key == "SHIFT+TAB");
  }
}

void Act(HWND dialog, const Line& line) {
  if (line.verb == "press") {
    Click(Clickable(dialog, line.rest));
  } else if (line.verb == "click-during") {
    Click(Existing(dialog, line.rest));
  } else if (line.verb == "type") {
    const size_t blank = std::min(line.rest.find(' '), line.rest.size());
    const std::wstring text = Wide(line.rest.substr(std::min(blank + 1, line.rest.size())));
    const HWND edit = Clickable(dialog, line.rest.substr(0, blank));
    Ask(edit, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(text.c_str()));
  } else if (line.verb == "load") {
    LoadLibraryInProgram(line.rest);
  } else if (line.verb == "escape" || line.verb == "escape-during") {
    PressKey(VK_ESCAPE);
  } else if (line.verb == "close" || line.verb == "close-during") {
    PostMessageA(dialog, WM_SYSCOMMAND, SC_CLOSE, 0);
  } else if (line.verb == "show") {
    Show(dialog, line.rest);
  } else if (line.verb == "show-focus") {
    Print(DescribeDialog(dialog).front());
  } else if (line.verb == "show-drawn") {
    for (const std::string& drawn : DescribeDrawn(dialog)) Print(drawn);
  } else if (line.verb == "keyboard") {
    UseKeyboard(dialog, line.rest);
  } else if (line.verb == "picture" || line.verb == "picture-during") {
    WaitForPicture(line.rest);
  } else if (line.verb == "until-during") {
    WaitForMessage(dialog, Wide(line.rest));
  } else if (line.verb == "until-file") {
    WaitForFile(line.rest);
  } else if (line.verb == "key") {
    HKEY key = nullptr;
    RegCreateKeyW(HKEY_LOCAL_MACHINE, Wide(line.rest).c_str(), &key);
    RegCloseKey(key);
  } else if (line.verb != "wait") {
    Fail("not a line for a real window: " + line.verb);
  }
}

bool IsInputDuring() {
  return !script.empty() && script.front().verb.ends_with("-during") &&
         script.front().verb != "until-during" && script.front().verb != "picture-during";
}

// A line and those that belong to its step. A press goes by way of a posted message then, so that
// it comes before all of them.
void ActWithDuring(HWND dialog, const Line& line) {
  const bool isJoined = line.verb == "press" && IsInputDuring();
  const HWND pressed = isJoined ? Clickable(dialog, line.rest) : nullptr;
  if (!isJoined) Act(dialog, line);
  if (IsInputDuring()) {
    SuspendThread(DrivenProcess().hThread);
    if (isJoined) PostMessageA(pressed, BM_CLICK, 0, 0);
    for (; IsInputDuring(); script.pop_front()) Act(dialog, script.front());
    ResumeThread(DrivenProcess().hThread);
  }
  for (; !script.empty() && script.front().verb.ends_with("-during"); script.pop_front()) {
    Act(dialog, script.front());
  }
}

void ReadScript(const char* path) {
  std::ifstream stream(path);
  if (!stream) Fail(std::string("can't read ") + path);
  for (std::string text; std::getline(stream, text);) {
    if (text.empty() || text[0] == '#') continue;
    const size_t blank = std::min(text.find(' '), text.size());
    const Line line = {text.substr(0, blank), text.substr(std::min(blank + 1, text.size()))};
    if (!answers.Take(line)) script.push_back(line);
  }
}

void Play() {
  HWND dialog = WaitForPage();
  while (!script.empty() && dialog != nullptr) {
    const Line line = script.front();
    script.pop_front();
    ActWithDuring(dialog, line);
    dialog = WaitForPage();
  }
  if (dialog != nullptr) {
    Show(dialog);
    Fail("the script ends while the dialog is open");
  }
  if (!script.empty() || answers.AreLeft()) Fail("lines or answers are left over");
}

// The rest of a command line behind its first `count` words; a word is in quotes or has no blanks.
std::string SkipWords(const char* text, int count) {
  for (; count > 0; --count) {
    const char end = *text == '"' ? '"' : ' ';
    if (end == '"') ++text;
    while (*text != '\0' && *text != end) ++text;
    if (*text == '"') ++text;
    while (*text == ' ') ++text;
  }
  return text;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc < 4 || !OpenReport(argv[2])) return 2;
  ReadScript(argv[1]);
  const auto isDrawn = [](const Line& line) { return line.verb == "show-drawn"; };
  if (std::ranges::any_of(script, isDrawn)) ReadPictures(argv[3]);
  if (!StartProgram(argv[3], SkipWords(GetCommandLineA(), 3))) {
    Fail("can't start the program: " + std::to_string(GetLastError()));
  }
  Play();
  Print("exit code: " + std::to_string(ExitCodeOfProgram()));
  return 0;
}

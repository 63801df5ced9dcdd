// Plays a user's script on the real window of the setup program, and prints what that user sees:
// the same lines that the stand-in machine prints for the same script (docs/stand-in-machine.md).
//
//   dialog_driver SCRIPT OUTPUT PROGRAM ARGUMENTS
//
// SCRIPT and OUTPUT have no blanks; all that stands behind them is the program's command line, as
// it is. OUTPUT is a file, made anew, in UTF-8; its last line is "exit code: N", or one that begins
// with "failed: " when the script doesn't fit the run.
//
// "at-poll" is the stand-in's alone. A line that begins a step and the lines "...-during" behind it
// reach the program's queue while its thread stands still, so that nothing comes between them.
// "until-during TEXT" lets it run until the message area has this text: the pass has come so far,
// and what follows meets its next polls. "until-file PATH" waits for a file that another program
// writes. Three lines more are for tools/screenshots: "picture NAME"
// prints itself and waits until the file OUTPUT.NAME is there; "picture-during NAME" does so at
// once behind the line before it, "picture-box NAME" when the next box stands.
#include <windows.h>
// After windows.h.
#include <shlobj.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <fstream>
#include <string>
#include <vector>

#include "tests/windows/dialog_view.h"
#include "tests/windows/user_input.h"

namespace {

constexpr DWORD kStepTime = 20;   // milliseconds between two looks
constexpr int kStableLooks = 4;   // a page that has not changed for so many looks stands
constexpr int kMostLooks = 1500;  // half a minute, for one line

struct Line {
  std::string verb;
  std::string rest;
};

std::deque<Line> script;
std::deque<Line> answers;
std::deque<Line> picks;
std::deque<Line> boxPictures;
std::string outputPath;
std::FILE* output = nullptr;
PROCESS_INFORMATION process;

void Print(const std::string& line) {
  std::fputs((line + "\n").c_str(), output);
  std::fflush(output);
}

[[noreturn]] void Fail(const std::string& what) {
  Print("failed: " + what);
  // Its own file is free again only when it is gone.
  TerminateProcess(process.hProcess, 1);
  WaitForSingleObject(process.hProcess, 10000);
  std::exit(1);
}

// Lets somebody outside take a picture of the display.
void WaitForPicture(const std::string& name) {
  Print("picture " + name);
  for (int look = 0; look < kMostLooks; ++look) {
    if (GetFileAttributesA((outputPath + "." + name).c_str()) != INVALID_FILE_ATTRIBUTES) return;
    Sleep(kStepTime);
  }
  Fail("nobody took the picture " + name);
}

// The whole dialog, or the line of the one control that bears the id.
void Show(HWND dialog, const std::string& id = "") {
  for (const std::string& line : DescribeDialog(dialog)) {
    if (id.empty() || line.starts_with(id + " ")) Print(line);
  }
}

bool HasEnded() {
  return WaitForSingleObject(process.hProcess, 0) == WAIT_OBJECT_0;
}

// ---- Boxes and pickers

void PressButton(HWND window, int id) {
  PostMessageA(GetDlgItem(window, id), BM_CLICK, 0, 0);
  for (int look = 0; look < kMostLooks && IsWindow(window) && IsWindowVisible(window); ++look) {
    Sleep(kStepTime);
  }
}

// Until the dialog under the box has not changed for a while: all that was posted is through.
void WaitForQuiet(HWND dialog) {
  std::vector<std::string> before;
  for (int same = 0; same < 4 * kStableLooks; ++same) {
    const std::vector<std::string> now = DescribeDialog(dialog);
    if (now != before) same = 0;
    before = now;
    Sleep(kStepTime);
  }
}

BOOL CALLBACK FindTree(HWND window, LPARAM data) {
  if (ClassOf(window) != "SysTreeView32") return TRUE;
  *reinterpret_cast<bool*>(data) = true;
  return FALSE;
}

// The picker takes the path from its own memory.
void SelectFolder(HWND picker, const std::string& path) {
  const std::wstring text = Wide(path);
  const size_t size = (text.size() + 1) * sizeof(wchar_t);
  void* const place =
      VirtualAllocEx(process.hProcess, nullptr, size, MEM_COMMIT | MEM_RESERVE, PAGE_READWRITE);
  WriteProcessMemory(process.hProcess, place, text.c_str(), size, nullptr);
  Ask(picker, BFFM_SETSELECTIONW, TRUE, reinterpret_cast<LPARAM>(place));
  VirtualFreeEx(process.hProcess, place, 0, MEM_RELEASE);
}

void AnswerPicker(HWND picker) {
  if (picks.empty()) Fail("no answer to the folder picker");
  const std::string pick = picks.front().rest;
  picks.pop_front();
  std::wstring prompt;
  for (HWND child = GetWindow(picker, GW_CHILD); child != nullptr && prompt.empty();
       child = GetWindow(child, GW_HWNDNEXT)) {
    if (ClassOf(child) == "Static") prompt = TextOf(child);
  }
  Print("picker " + Quoted(prompt) + " " + pick);
  if (pick != "none") SelectFolder(picker, pick);
  PressButton(picker, pick == "none" ? IDCANCEL : IDOK);
}

void AnswerBox(const ProgramWindows& windows) {
  const HWND box = windows.modal;
  if (!boxPictures.empty()) {
    const std::string name = boxPictures.front().rest;
    boxPictures.pop_front();
    Sleep(10 * kStepTime);  // until it is drawn
    WaitForPicture(name);
  }
  std::wstring text;
  for (HWND child = GetWindow(box, GW_CHILD); child != nullptr;
       child = GetWindow(child, GW_HWNDNEXT)) {
    if (ClassOf(child) == "Static" && !TextOf(child).empty()) text = TextOf(child);
  }
  const std::string shown = "box " + Quoted(TextOf(box)) + " " + Quoted(text) + " ";
  if (GetDlgItem(box, IDYES) == nullptr) {
    Print(shown + "ok");
    PressButton(box, GetDlgItem(box, IDOK) != nullptr ? IDOK : IDCANCEL);
    return;
  }
  if (answers.empty()) Fail("no answer to " + shown);
  const Line answer = answers.front();
  answers.pop_front();
  if (answer.verb == "answer-late" && windows.dialog != nullptr) WaitForQuiet(windows.dialog);
  Print(shown + answer.rest);
  PressButton(box, answer.rest == "yes" ? IDYES : IDNO);
}

void AnswerModal(const ProgramWindows& windows) {
  bool isPicker = false;
  EnumChildWindows(windows.modal, FindTree, reinterpret_cast<LPARAM>(&isPicker));
  if (isPicker) {
    AnswerPicker(windows.modal);
  } else {
    AnswerBox(windows);
  }
}

// ---- The script

// The dialog when a page of it stands and nothing moves; null when the program has ended. Answers
// boxes and pickers on the way.
HWND WaitForPage() {
  std::vector<std::string> before;
  int same = 0;
  for (int look = 0; look < kMostLooks; ++look) {
    if (HasEnded()) return nullptr;
    const ProgramWindows windows = FindWindows(process.dwProcessId);
    if (windows.modal != nullptr) {
      AnswerModal(windows);
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
  } else if (line.verb == "escape" || line.verb == "escape-during") {
    PressKey(VK_ESCAPE);
  } else if (line.verb == "close" || line.verb == "close-during") {
    PostMessageA(dialog, WM_SYSCOMMAND, SC_CLOSE, 0);
  } else if (line.verb == "show") {
    Show(dialog, line.rest);
  } else if (line.verb == "picture" || line.verb == "picture-during") {
    Sleep(10 * kStepTime);  // until it is drawn
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
    SuspendThread(process.hThread);
    if (isJoined) PostMessageA(pressed, BM_CLICK, 0, 0);
    for (; IsInputDuring(); script.pop_front()) Act(dialog, script.front());
    ResumeThread(process.hThread);
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
    const bool isAnswer = line.verb == "answer" || line.verb == "answer-late";
    if (line.verb == "picture-box") {
      boxPictures.push_back(line);
    } else {
      (isAnswer ? answers : line.verb == "pick" ? picks : script).push_back(line);
    }
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
  if (!script.empty() || !answers.empty() || !picks.empty()) Fail("lines or answers are left over");
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
  if (argc < 4) return 2;
  outputPath = argv[2];
  output = std::fopen(argv[2], "wb");
  if (output == nullptr) return 2;
  ReadScript(argv[1]);
  std::string commandLine = SkipWords(GetCommandLineA(), 3);
  STARTUPINFOA startup = {};
  startup.cb = sizeof startup;
  if (!CreateProcessA(argv[3], commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, "C:\\",
                      &startup, &process)) {
    Fail("can't start the program");
  }
  Play();
  DWORD code = 0;
  GetExitCodeProcess(process.hProcess, &code);
  Print("exit code: " + std::to_string(static_cast<int>(code)));
  std::fclose(output);
  return 0;
}

// Plays a user's script on the real window of the setup program, and prints what that user sees:
// the same lines that the stand-in machine prints for the same script (docs/stand-in-machine.md).
//
//   dialog_driver SCRIPT OUTPUT PROGRAM ARGUMENTS...
//
// OUTPUT is a file, made anew, in UTF-8; its last line is "exit code: N", or one that begins with
// "failed: " when the script doesn't fit the run. "at-poll" is the stand-in's alone. Three lines
// more are for tools/screenshots: "picture NAME" prints itself and waits until the file OUTPUT.NAME
// is there; "picture-during NAME" does so at once behind the line before it, "picture-box NAME"
// when the next box stands.
#include <windows.h>
// After windows.h.
#include <shlobj.h>

#include <cstdio>
#include <cstdlib>
#include <deque>
#include <fstream>
#include <string>
#include <vector>

namespace {

constexpr DWORD kStepTime = 20;   // milliseconds between two looks
constexpr int kStableLooks = 4;   // a page that has not changed for so many looks stands
constexpr int kMostLooks = 1500;  // half a minute, for one line
constexpr int kMessageArea = 901;
constexpr int kSpaceLine = 921;

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
  TerminateProcess(process.hProcess, 1);
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

// ---- Texts

std::string Utf8(const std::wstring& text) {
  const int wide = static_cast<int>(text.size());
  const int size = WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, nullptr, 0, nullptr, nullptr);
  std::string bytes(static_cast<size_t>(size), '\0');
  WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, bytes.data(), size, nullptr, nullptr);
  return bytes;
}

std::wstring Wide(const std::string& text) {
  const int bytes = static_cast<int>(text.size());
  const int size = MultiByteToWideChar(CP_UTF8, 0, text.data(), bytes, nullptr, 0);
  std::wstring wide(static_cast<size_t>(size), L'\0');
  MultiByteToWideChar(CP_UTF8, 0, text.data(), bytes, wide.data(), size);
  return wide;
}

std::string Quoted(const std::wstring& text) {
  std::string quoted = "\"";
  for (const char byte : Utf8(text)) {
    if (byte == '\r') {
      quoted += "\\r";
    } else if (byte == '\n') {
      quoted += "\\n";
    } else {
      if (byte == '"' || byte == '\\') quoted += '\\';
      quoted += byte;
    }
  }
  return quoted + '"';
}

// A busy window answers late; one that never does gives an empty text.
LRESULT Ask(HWND window, UINT message, WPARAM wParam = 0, LPARAM lParam = 0) {
  DWORD_PTR answer = 0;
  SendMessageTimeoutW(window, message, wParam, lParam, SMTO_NORMAL, 5000, &answer);
  return static_cast<LRESULT>(answer);
}

std::wstring TextOf(HWND window) {
  wchar_t text[2048] = {};
  Ask(window, WM_GETTEXT, std::size(text), reinterpret_cast<LPARAM>(text));
  return text;
}

std::string ClassOf(HWND window) {
  char name[64] = {};
  GetClassNameA(window, name, sizeof name);
  return name;
}

// ---- Windows

struct Windows {
  HWND dialog = nullptr;  // the program's own
  HWND modal = nullptr;   // a message box or folder picker above it
};

BOOL CALLBACK NoteWindow(HWND window, LPARAM data) {
  auto* const found = reinterpret_cast<Windows*>(data);
  DWORD owner = 0;
  GetWindowThreadProcessId(window, &owner);
  if (owner != process.dwProcessId || ClassOf(window) != "#32770") return TRUE;
  if (GetDlgItem(window, kMessageArea) != nullptr) {
    found->dialog = window;
  } else if (IsWindowVisible(window)) {
    found->modal = window;
  }
  return TRUE;
}

Windows FindWindows() {
  Windows found;
  EnumWindows(NoteWindow, reinterpret_cast<LPARAM>(&found));
  return found;
}

bool HasEnded() {
  return WaitForSingleObject(process.hProcess, 0) == WAIT_OBJECT_0;
}

int IdOf(HWND control) {
  return GetDlgCtrlID(control) & 0xFFFF;
}

bool IsShown(HWND control) {
  return (GetWindowLongA(control, GWL_STYLE) & WS_VISIBLE) != 0;
}

std::string Shown(HWND control) {
  const LONG style = GetWindowLongA(control, GWL_STYLE);
  const std::string className = ClassOf(control);
  const std::string line = std::to_string(IdOf(control)) + " " + className +
                           (IsShown(control) ? " shown" : " hidden") +
                           ((style & WS_DISABLED) == 0 ? " enabled " : " disabled ");
  if (className != "ComboBox") {
    const bool isPicture = className == "Static" && (style & SS_TYPEMASK) == SS_BITMAP;
    return line + Quoted(isPicture ? L"" : TextOf(control));
  }
  const LRESULT selected = Ask(control, CB_GETCURSEL);
  if (static_cast<int>(selected) < 0) return line + "none";
  return line + "selected " + std::to_string(static_cast<int>(selected)) + " of " +
         std::to_string(static_cast<int>(Ask(control, CB_GETCOUNT)));
}

// The dialog as `show` prints it.
std::vector<std::string> Snapshot(HWND dialog) {
  std::vector<std::string> lines(1);
  std::string defaultId = "none";
  for (HWND control = GetWindow(dialog, GW_CHILD); control != nullptr;
       control = GetWindow(control, GW_HWNDNEXT)) {
    lines.push_back(Shown(control));
    const bool isDefault = (GetWindowLongA(control, GWL_STYLE) & 0xF) == BS_DEFPUSHBUTTON;
    if (defaultId == "none" && isDefault && ClassOf(control) == "Button" && IsShown(control)) {
      defaultId = std::to_string(IdOf(control));
    }
  }
  GUITHREADINFO thread = {};
  thread.cbSize = sizeof thread;
  GetGUIThreadInfo(process.dwThreadId, &thread);
  const bool hasFocus = thread.hwndFocus != nullptr && GetParent(thread.hwndFocus) == dialog;
  lines[0] = "dialog " + Quoted(TextOf(dialog)) + " focus " +
             (hasFocus ? std::to_string(IdOf(thread.hwndFocus)) : "none") + " default " + defaultId;
  return lines;
}

void Show(HWND dialog) {
  for (const std::string& line : Snapshot(dialog)) Print(line);
}

// A page that waits for its user: an end page, or one whose last control is shown. Between them
// only the rightmost button is there.
bool IsPage(HWND dialog) {
  return GetDlgItem(dialog, IDOK) != nullptr || GetDlgItem(dialog, 906) != nullptr ||
         IsShown(GetDlgItem(dialog, kSpaceLine));
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
    const std::vector<std::string> now = Snapshot(dialog);
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

void AnswerBox(const Windows& windows) {
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

void AnswerModal(const Windows& windows) {
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
    const Windows windows = FindWindows();
    if (windows.modal != nullptr) {
      AnswerModal(windows);
      same = 0;
    } else if (windows.dialog != nullptr && IsPage(windows.dialog)) {
      const std::vector<std::string> now = Snapshot(windows.dialog);
      same = now == before ? same + 1 : 0;
      before = now;
      if (same >= kStableLooks) return windows.dialog;
    }
    Sleep(kStepTime);
  }
  Fail("the dialog never waits for its user");
}

HWND Clickable(HWND dialog, const std::string& id) {
  const HWND control = GetDlgItem(dialog, std::atoi(id.c_str()));
  if (control == nullptr || !IsShown(control) || !IsWindowEnabled(control)) {
    Show(dialog);
    Fail("no user could click on " + id);
  }
  return control;
}

// The messages of a mouse on the control. They go through the program's own queue as a real click's
// do; the pointer itself stays where it is, so that no other window of the display matters.
void Click(HWND control) {
  RECT area = {};
  GetClientRect(control, &area);
  const LPARAM middle = MAKELPARAM(area.right / 2, area.bottom / 2);
  PostMessageA(control, WM_LBUTTONDOWN, MK_LBUTTON, middle);
  PostMessageA(control, WM_LBUTTONUP, 0, middle);
}

void Act(HWND dialog, const Line& line) {
  if (line.verb == "press" || line.verb == "click-during") {
    Click(Clickable(dialog, line.rest));
  } else if (line.verb == "type") {
    const size_t blank = std::min(line.rest.find(' '), line.rest.size());
    const std::wstring text = Wide(line.rest.substr(std::min(blank + 1, line.rest.size())));
    const HWND edit = Clickable(dialog, line.rest.substr(0, blank));
    Ask(edit, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(text.c_str()));
  } else if (line.verb == "escape") {
    PostMessageA(dialog, WM_KEYDOWN, VK_ESCAPE, 1);
  } else if (line.verb == "close") {
    PostMessageA(dialog, WM_SYSCOMMAND, SC_CLOSE, 0);
  } else if (line.verb == "show") {
    Show(dialog);
  } else if (line.verb == "picture" || line.verb == "picture-during") {
    Sleep(10 * kStepTime);  // until it is drawn
    WaitForPicture(line.rest);
  } else if (line.verb == "key") {
    HKEY key = nullptr;
    RegCreateKeyW(HKEY_LOCAL_MACHINE, Wide(line.rest).c_str(), &key);
    RegCloseKey(key);
  } else if (line.verb != "wait") {
    Fail("not a line for a real window: " + line.verb);
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
    Act(dialog, line);
    while (!script.empty() && script.front().verb.ends_with("-during")) {
      Act(dialog, script.front());
      script.pop_front();
    }
    dialog = WaitForPage();
  }
  if (dialog != nullptr) {
    Show(dialog);
    Fail("the script ends while the dialog is open");
  }
  if (!script.empty() || !answers.empty() || !picks.empty()) Fail("lines or answers are left over");
}

}  // namespace

int main(int argc, char** argv) {
  if (argc < 4) return 2;
  outputPath = argv[2];
  output = std::fopen(argv[2], "wb");
  if (output == nullptr) return 2;
  ReadScript(argv[1]);
  std::string commandLine = std::string("\"") + argv[3] + "\"";
  for (int i = 4; i < argc; ++i) commandLine += std::string(" ") + argv[i];
  STARTUPINFOA startup = {};
  startup.cb = sizeof startup;
  if (!CreateProcessA(argv[3], commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, "C:\\",
                      &startup, &process)) {
    Print("failed: can't start the program");
    return 1;
  }
  Play();
  DWORD code = 0;
  GetExitCodeProcess(process.hProcess, &code);
  Print("exit code: " + std::to_string(static_cast<int>(code)));
  std::fclose(output);
  return 0;
}

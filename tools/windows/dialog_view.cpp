#include "tools/windows/dialog_view.h"

#include <iterator>

namespace {

constexpr int kMessageArea = 901;
constexpr int kFailureEnd = 906;
constexpr int kSpaceLine = 921;

struct Search {
  DWORD processId;
  ProgramWindows found;
};

BOOL CALLBACK NoteWindow(HWND window, LPARAM data) {
  auto* const search = reinterpret_cast<Search*>(data);
  DWORD owner = 0;
  GetWindowThreadProcessId(window, &owner);
  if (owner != search->processId || ClassOf(window) != "#32770") return TRUE;
  if (GetDlgItem(window, kMessageArea) != nullptr) {
    search->found.dialog = window;
  } else if (IsWindowVisible(window)) {
    search->found.modal = window;
  }
  return TRUE;
}

std::string Utf8(const std::wstring& text) {
  const int wide = static_cast<int>(text.size());
  const int size = WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, nullptr, 0, nullptr, nullptr);
  std::string bytes(static_cast<size_t>(size), '\0');
  WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, bytes.data(), size, nullptr, nullptr);
  return bytes;
}

int IdOf(HWND control) {
  return GetDlgCtrlID(control) & 0xFFFF;
}

std::string DescribeControl(HWND control) {
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

}  // namespace

ProgramWindows FindWindows(DWORD processId) {
  Search search = {processId, {}};
  EnumWindows(NoteWindow, reinterpret_cast<LPARAM>(&search));
  return search.found;
}

std::vector<std::string> DescribeDialog(HWND dialog) {
  std::vector<std::string> lines(1);
  std::string defaultId = "none";
  for (const HWND control : ChildrenOf(dialog)) {
    lines.push_back(DescribeControl(control));
    const bool isDefault = (GetWindowLongA(control, GWL_STYLE) & 0xF) == BS_DEFPUSHBUTTON;
    if (defaultId == "none" && isDefault && ClassOf(control) == "Button" && IsShown(control)) {
      defaultId = std::to_string(IdOf(control));
    }
  }
  const HWND focus = FocusOf(dialog);
  lines[0] = "dialog " + Quoted(TextOf(dialog)) + " focus " +
             (focus != nullptr ? std::to_string(IdOf(focus)) : "none") + " default " + defaultId;
  return lines;
}

std::vector<HWND> ChildrenOf(HWND window) {
  std::vector<HWND> children;
  for (HWND child = GetWindow(window, GW_CHILD); child != nullptr;
       child = GetWindow(child, GW_HWNDNEXT)) {
    children.push_back(child);
  }
  return children;
}

HWND FocusOf(HWND dialog) {
  GUITHREADINFO thread = {};
  thread.cbSize = sizeof thread;
  GetGUIThreadInfo(GetWindowThreadProcessId(dialog, nullptr), &thread);
  return GetParent(thread.hwndFocus) == dialog ? thread.hwndFocus : nullptr;
}

bool IsPage(HWND dialog) {
  return GetDlgItem(dialog, IDOK) != nullptr || GetDlgItem(dialog, kFailureEnd) != nullptr ||
         IsShown(GetDlgItem(dialog, kSpaceLine));
}

std::wstring ReadMessageArea(HWND dialog) {
  return TextOf(GetDlgItem(dialog, kMessageArea));
}

bool IsShown(HWND control) {
  return (GetWindowLongA(control, GWL_STYLE) & WS_VISIBLE) != 0;
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

LRESULT Ask(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
  DWORD_PTR answer = 0;
  SendMessageTimeoutW(window, message, wParam, lParam, SMTO_NORMAL, 5000, &answer);
  return static_cast<LRESULT>(answer);
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
  for (const char character : Utf8(text)) {
    if (character == '\r') {
      quoted += "\\r";
    } else if (character == '\n') {
      quoted += "\\n";
    } else {
      if (character == '"' || character == '\\') quoted += '\\';
      quoted += character;
    }
  }
  return quoted + '"';
}

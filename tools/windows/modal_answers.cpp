#include "tools/windows/modal_answers.h"

// After windows.h.
#include <shlobj.h>

#include <iterator>
#include <vector>

#include "tools/windows/driven_program.h"
#include "tools/windows/screen_pixels.h"

namespace {

constexpr int kQuietLooks = 16;  // a dialog that has not changed for so many looks is quiet

Line TakeFirst(std::deque<Line>* lines) {
  Line line = lines->front();
  lines->pop_front();
  return line;
}

// The prompt of a picker or the text of a box; the box's icon has none.
std::wstring ReadStatic(HWND modal) {
  for (const HWND child : ChildrenOf(modal)) {
    if (ClassOf(child) == "Static" && !TextOf(child).empty()) return TextOf(child);
  }
  return L"";
}

void PressButton(HWND window, int id) {
  PostMessageA(GetDlgItem(window, id), BM_CLICK, 0, 0);
  for (int look = 0; look < kMostLooks && IsWindow(window) && IsWindowVisible(window); ++look) {
    Sleep(kStepTime);
  }
}

// Until the dialog under the box has not changed for a while: all that was posted is through.
void WaitForQuiet(HWND dialog) {
  std::vector<std::string> before;
  for (int same = 0; same < kQuietLooks; ++same) {
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
  WithCopyInProgram(text.c_str(), (text.size() + 1) * sizeof(wchar_t), [picker](void* place) {
    Ask(picker, BFFM_SETSELECTIONW, TRUE, reinterpret_cast<LPARAM>(place));
  });
}

void AnswerPicker(HWND picker, std::deque<Line>* picks) {
  if (picks->empty()) Fail("no answer to the folder picker");
  const std::string pick = TakeFirst(picks).rest;
  Print("picker " + Quoted(ReadStatic(picker)) + " " + pick);
  if (pick != "none") SelectFolder(picker, pick);
  PressButton(picker, pick == "none" ? IDCANCEL : IDOK);
}

// "ICON BUTTONS default BUTTON", the buttons joined by hyphens.
std::string DescribeLook(HWND box) {
  constexpr const char* kNames[] = {"ok", "cancel", "abort", "retry", "ignore", "yes", "no"};
  std::string icon = "none";
  std::string buttons;
  std::string standard = "none";
  for (const HWND child : ChildrenOf(box)) {
    const LONG style = GetWindowLongA(child, GWL_STYLE);
    if (ClassOf(child) == "Static") {
      if ((style & SS_TYPEMASK) == SS_ICON && Ask(child, STM_GETICON) != 0) icon = SeenIcon(child);
      continue;
    }
    const auto index = static_cast<size_t>(GetDlgCtrlID(child) - IDOK);
    const std::string name = index < std::size(kNames) ? kNames[index] : "other";
    buttons += (buttons.empty() ? "" : "-") + name;
    if ((style & BS_TYPEMASK) == BS_DEFPUSHBUTTON) standard = name;
  }
  return icon + " " + buttons + " default " + standard;
}

void AnswerBox(const ProgramWindows& windows, ModalAnswers* given) {
  const HWND box = windows.modal;
  if (!given->pictures.empty()) WaitForPicture(TakeFirst(&given->pictures).rest);
  const std::string shown = "box " + Quoted(TextOf(box)) + " " + Quoted(ReadStatic(box)) + " ";
  const auto tell = [&](const std::string& answer) {
    Print(shown + answer);
    if (given->showsBoxes) Print("box-look " + DescribeLook(box));
  };
  if (GetDlgItem(box, IDYES) == nullptr) {
    tell("ok");
    PressButton(box, GetDlgItem(box, IDOK) != nullptr ? IDOK : IDCANCEL);
    return;
  }
  if (given->answers.empty()) Fail("no answer to " + shown);
  const Line answer = TakeFirst(&given->answers);
  if (answer.verb == "answer-late" && windows.dialog != nullptr) WaitForQuiet(windows.dialog);
  tell(answer.rest);
  PressButton(box, answer.rest == "yes" ? IDYES : IDNO);
}

}  // namespace

bool ModalAnswers::Take(const Line& line) {
  if (line.verb == "show-boxes") return showsBoxes = true;
  std::deque<Line>* const queue = line.verb == "answer" || line.verb == "answer-late" ? &answers
                                  : line.verb == "pick"                               ? &picks
                                  : line.verb == "picture-box"                        ? &pictures
                                                                                      : nullptr;
  if (queue != nullptr) queue->push_back(line);
  return queue != nullptr;
}

void AnswerModal(const ProgramWindows& windows, ModalAnswers* given) {
  bool isPicker = false;
  EnumChildWindows(windows.modal, FindTree, reinterpret_cast<LPARAM>(&isPicker));
  if (isPicker) {
    AnswerPicker(windows.modal, &given->picks);
  } else {
    AnswerBox(windows, given);
  }
}

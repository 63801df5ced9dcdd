#include "machine/scripted_user.h"

#include <cstdio>
#include <cstdlib>
#include <deque>
#include <fstream>
#include <optional>
#include <sstream>
#include <vector>

#include "machine/code_page.h"
#include "machine/registry_store.h"
#include "machine/windows.h"

namespace machine {
namespace {

struct Line {
  int number = 0;
  std::string verb;
  std::string rest;  // in UTF-8
};

struct PollLine {
  int poll = 0;
  Line line;
};

struct User {
  std::string file;
  std::deque<Line> lines;
  std::deque<Line> answers;
  std::deque<Line> picks;
  std::vector<PollLine> atPoll;
  std::deque<Line> duringClicks;  // wait for the running step's next poll
  int polls = 0;
};

std::optional<User> user;

[[noreturn]] void Fail(const std::string& what);

// ---- Reading

std::string TakeWord(std::string* text) {
  const size_t end = std::min(text->find(' '), text->size());
  std::string word = text->substr(0, end);
  text->erase(0, std::min(end + 1, text->size()));
  return word;
}

bool IsNumber(const std::string& text) {
  return !text.empty() && text.size() < 7 &&
         text.find_first_not_of("0123456789") == std::string::npos;
}

// What a line's rest must be, by its verb: n nothing, i an id, it an id and a text, yn yes or no, p
// a path, pn a path or none.
std::string FormOf(const std::string& verb) {
  static const std::pair<const char*, const char*> forms[] = {
      {"wait", "n"},         {"escape", "n"},       {"close", "n"}, {"show", "n"},
      {"press", "i"},        {"click-during", "i"}, {"type", "it"}, {"answer", "yn"},
      {"answer-late", "yn"}, {"pick", "p"},         {"key", "p"}};
  for (const auto& [name, form] : forms) {
    if (verb == name) return form;
  }
  return "";
}

bool FitsForm(const std::string& form, const std::string& rest) {
  if (form == "n") return rest.empty();
  if (form == "i") return IsNumber(rest);
  if (form == "it") return IsNumber(rest.substr(0, rest.find(' ')));
  if (form == "yn") return rest == "yes" || rest == "no";
  return form == "p" && !rest.empty();
}

// The number of a line "at-poll N LINE", which is taken off; 0 when it is another line or none.
int TakePollNumber(std::string* text) {
  std::string rest = *text;
  if (TakeWord(&rest) != "at-poll") return 0;
  const std::string number = TakeWord(&rest);
  if (!IsNumber(number)) return 0;
  *text = rest;
  return std::atoi(number.c_str());
}

bool ReadLine(User* read, int number, std::string text, std::string* error) {
  const int poll = TakePollNumber(&text);
  Line line = {.number = number, .verb = "", .rest = text};
  line.verb = TakeWord(&line.rest);
  const std::string form = FormOf(line.verb);
  const bool isAnswer = line.verb == "answer" || line.verb == "answer-late";
  const bool isQueued = isAnswer || line.verb == "pick";
  if (form.empty() || !FitsForm(form, line.rest) || (poll > 0 && isQueued)) {
    *error = read->file + ":" + std::to_string(number) + ": not a line of a user's script: " + text;
    return false;
  }
  if (poll > 0) {
    read->atPoll.push_back({poll, line});
  } else if (isAnswer) {
    read->answers.push_back(line);
  } else if (line.verb == "pick") {
    read->picks.push_back(line);
  } else {
    read->lines.push_back(line);
  }
  return true;
}

// ---- Showing

std::string Shown(const Window& control) {
  std::string line = std::to_string(control.id) + " " + control.className + " " +
                     (control.IsShown() ? "shown " : "hidden ") +
                     (control.IsEnabled() ? "enabled " : "disabled ");
  if (control.kind != WindowKind::kComboBox) {
    return line + Quoted(control.hasPicture ? "" : control.text);
  }
  if (control.selection < 0) return line + "none";
  return line + "selected " + std::to_string(control.selection) + " of " +
         std::to_string(control.items.size());
}

std::string IdOrNone(const Window* window) {
  return window != nullptr ? std::to_string(window->id) : "none";
}

const Window* DefaultButton(const Dialog& dialog) {
  for (const auto& control : dialog.controls) {
    const bool isDefault = (control->style & 0xF) == BS_DEFPUSHBUTTON;
    if (control->kind == WindowKind::kButton && isDefault && control->IsShown()) {
      return control.get();
    }
  }
  return nullptr;
}

void ShowDialog() {
  const Dialog& dialog = *OpenDialog();
  TellUser("dialog " + Quoted(dialog.frame.text) + " focus " +
           IdOrNone(FindWindowByHandle(dialog.focus)) + " default " +
           IdOrNone(DefaultButton(dialog)));
  for (const auto& control : dialog.controls) TellUser(Shown(*control));
}

// ---- Acting

void Fail(const std::string& what) {
  std::fflush(stdout);
  if (OpenDialog() != nullptr) ShowDialog();
  std::fprintf(stderr, "%s: %s\n", user->file.c_str(), what.c_str());
  std::fflush(nullptr);
  std::_Exit(2);
}

std::string LineName(const Line& line) {
  return "line " + std::to_string(line.number) + ", " + line.verb + " " + line.rest;
}

Window* Clickable(const Line& line) {
  Window* const control = OpenDialog()->Find(std::atoi(line.rest.c_str()));
  if (control == nullptr || !control->IsShown() || !control->IsEnabled()) {
    Fail(LineName(line) + ": no user could click on that");
  }
  return control;
}

void Type(const Line& line) {
  std::string text = line.rest;
  const std::string id = TakeWord(&text);
  Line onControl = line;
  onControl.rest = id;
  TypeText(Clickable(onControl), FromUtf8(text));
}

void MakeRegistryKey(const std::string& path) {
  MakeKey(LocalMachine(), FromUtf8(path));
  SaveRegistry();
}

// What a user does to an idle dialog.
void Act(const Line& line) {
  if (line.verb == "press") {
    Click(Clickable(line)->handle);
  } else if (line.verb == "type") {
    Type(line);
  } else if (line.verb == "escape" || line.verb == "close") {
    SendCancel();
  } else if (line.verb == "show") {
    ShowDialog();
  } else if (line.verb == "key") {
    MakeRegistryKey(line.rest);
  }
}

// What a user does to a dialog whose step is running: it waits in the queue. The program's own loop
// knows nothing of the dialog's keys, so that Escape has no effect there.
void ActDuringStep(const Line& line) {
  if (line.verb == "press" || line.verb == "click-during") {
    PostClick(Clickable(line)->handle);
  } else if (line.verb == "close") {
    PostCancel();
  } else if (line.verb == "show") {
    ShowDialog();
  } else if (line.verb == "key") {
    MakeRegistryKey(line.rest);
  } else if (line.verb != "escape" && line.verb != "wait") {
    Fail(LineName(line) + ": nothing that a user does during a step");
  }
}

// The clicks of the lines that follow an action go to the step that it has started.
void TakeDuringClicks() {
  while (!user->lines.empty() && user->lines.front().verb == "click-during") {
    user->duringClicks.push_back(user->lines.front());
    user->lines.pop_front();
  }
}

}  // namespace

bool LoadUser(const std::filesystem::path& script, std::string* error) {
  User read;
  read.file = script.string();
  std::ifstream stream(script);
  if (!stream) {
    *error = read.file + ": can't be read";
    return false;
  }
  std::string text;
  for (int number = 1; std::getline(stream, text); ++number) {
    if (!text.empty() && text.back() == '\r') text.pop_back();
    const size_t start = text.find_first_not_of(' ');
    if (start == std::string::npos || text[start] == '#') continue;
    if (!ReadLine(&read, number, text.substr(start), error)) return false;
  }
  user = std::move(read);
  TakeDuringClicks();
  return true;
}

void ForgetUser() {
  user.reset();
}

bool HasUser() {
  return user.has_value();
}

void RequireUser() {
  if (user) return;
  std::fprintf(stderr, "nobody can use the dialog: name a script of the user with MORIV_USER\n");
  std::fflush(nullptr);
  std::_Exit(2);
}

void TakeUserTurn() {
  DrawControls();
  if (!user->duringClicks.empty()) {
    // The step that these were meant for polled no more: they reach the idle dialog.
    const Line line = user->duringClicks.front();
    user->duringClicks.pop_front();
    Click(Clickable(line)->handle);
    return;
  }
  if (user->lines.empty()) Fail("the script ends while the dialog is open");
  const Line line = user->lines.front();
  user->lines.pop_front();
  // A click that follows is met by the first poll of what the action starts: inside its very
  // handler, or in the step that the handler has posted, behind which the click then waits.
  TakeDuringClicks();
  Act(line);
  while (OpenDialog() != nullptr && !user->duringClicks.empty()) {
    PostClick(Clickable(user->duringClicks.front())->handle);
    user->duringClicks.pop_front();
  }
}

void UserAtPoll() {
  if (!user || OpenDialog() == nullptr) return;
  ++user->polls;
  for (const PollLine& entry : user->atPoll) {
    if (entry.poll == user->polls) ActDuringStep(entry.line);
  }
  while (!user->duringClicks.empty()) {
    ActDuringStep(user->duringClicks.front());
    user->duringClicks.pop_front();
  }
}

int AnswerBox(const std::string& caption, const std::string& text, UINT type) {
  const std::string shown = "box " + Quoted(caption) + " " + Quoted(text) + " ";
  if ((type & MB_YESNO) == 0) {
    TellUser(shown + "ok");
    return IDOK;
  }
  if (user->answers.empty()) Fail("no answer to " + shown);
  const Line answer = user->answers.front();
  user->answers.pop_front();
  if (answer.verb == "answer-late") {
    while (OpenDialog() != nullptr && !OpenDialog()->hasEnded && DispatchNext()) {
    }
  }
  TellUser(shown + answer.rest);
  return answer.rest == "yes" ? IDYES : IDNO;
}

bool PickFolder(const std::string& prompt, std::string* path) {
  if (user->picks.empty()) Fail("no answer to the folder picker");
  const std::string picked = user->picks.front().rest;
  user->picks.pop_front();
  TellUser("picker " + Quoted(prompt) + " " + picked);
  *path = FromUtf8(picked);
  return picked != "none";
}

void TellUser(const std::string& line) {
  std::fputs((line + "\n").c_str(), stdout);
  std::fflush(stdout);
}

std::string Quoted(const std::string& text) {
  std::string quoted = "\"";
  for (const char byte : ToUtf8(text)) {
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

void EndUser() {
  if (!user) return;
  for (const std::deque<Line>* left :
       {&user->lines, &user->answers, &user->picks, &user->duringClicks}) {
    if (!left->empty()) Fail(LineName(left->front()) + ": left over when the dialog ended");
  }
}

}  // namespace machine

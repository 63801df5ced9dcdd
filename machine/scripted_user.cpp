#include "machine/scripted_user.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <iterator>
#include <optional>
#include <utility>
#include <vector>

#include "machine/code_page.h"
#include "machine/dialog_keys.h"
#include "machine/owner_drawing.h"
#include "machine/registry_store.h"
#include "machine/shown_dialog.h"
#include "machine/user_script.h"
#include "machine/windows.h"

namespace machine {
namespace {

struct User {
  UserScript script;
  std::function<void()> turn;   // of a user without a script
  std::deque<UserLine> during;  // wait for the running step's next poll
  int polls = 0;
};

std::optional<User> user;

[[noreturn]] void Fail(const std::string& what) {
  constexpr int kUnfitScriptStatus = 2;
  if (OpenDialog() != nullptr) ShowDialog();
  std::fprintf(stderr, "%s\n", what.c_str());
  std::fflush(nullptr);
  std::_Exit(kUnfitScriptStatus);
}

UserLine TakeFirst(std::deque<UserLine>* lines) {
  UserLine line = lines->front();
  lines->pop_front();
  return line;
}

Window* Clickable(const UserLine& line) {
  Window* const control = OpenDialog()->Find(line.control);
  if (control == nullptr || !control->IsShown() || !control->IsEnabled()) {
    Fail(line.place + ": no user could click on that");
  }
  return control;
}

// Where a click lands that does not look: on the control, whatever has become of it.
Window* Existing(const UserLine& line) {
  Window* const control = OpenDialog()->Find(line.control);
  if (control == nullptr) Fail(line.place + ": there is no such control");
  return control;
}

bool IsRead(const std::string& text) {
  return std::ranges::any_of(OpenDialog()->controls, [&text](const auto& control) {
    return control->IsShown() && control->text.find(text) != std::string::npos;
  });
}

void Type(const UserLine& line) {
  Window* const control = Clickable(line);
  if (control->kind != WindowKind::kEdit) Fail(line.place + ": not an edit field");
  TypeText(control, FromUtf8(line.detail));
}

void UseKeyboard(const UserLine& line) {
  if (!PressKey(line.detail)) Fail(line.place + ": nothing that takes the key has the focus");
}

void MakeRegistryKey(const std::string& path) {
  MakeKey(LocalMachine(), FromUtf8(path));
  SaveRegistry();
}

// What is done at once, whatever the dialog is at.
void ActBesideTheDialog(const UserLine& line) {
  if (line.verb == UserVerb::kShow) ShowDialog(line.control);
  if (line.verb == UserVerb::kShowFocus) ShowFocus();
  if (line.verb == UserVerb::kShowDrawn) ShowDrawn();
  if (line.verb == UserVerb::kKey) MakeRegistryKey(line.detail);
}

// What a user does to an idle dialog.
void Act(const UserLine& line) {
  switch (line.verb) {
    case UserVerb::kPress:
      Click(Clickable(line)->handle);
      break;
    case UserVerb::kClickDuring:
      Click(Existing(line)->handle);
      break;
    case UserVerb::kType:
      Type(line);
      break;
    case UserVerb::kKeyboard:
      UseKeyboard(line);
      break;
    case UserVerb::kEscape:
    case UserVerb::kEscapeDuring:
    case UserVerb::kClose:
    case UserVerb::kCloseDuring:
      SendCancel();
      break;
    case UserVerb::kUntilDuring:
      if (!IsRead(FromUtf8(line.detail))) Fail(line.place + ": the step never said that");
      break;
    default:  // kWait: the dialog waits already
      ActBesideTheDialog(line);
      break;
  }
}

// What a user does to a dialog whose step is running: it waits in the queue. The program's own loop
// knows nothing of the dialog's keys, so that Escape has no effect there.
void ActDuringStep(const UserLine& line) {
  switch (line.verb) {
    case UserVerb::kPress:
      PostClick(Clickable(line)->handle);
      break;
    case UserVerb::kClickDuring:
      PostClick(Existing(line)->handle);
      break;
    case UserVerb::kClose:
    case UserVerb::kCloseDuring:
      PostCancel();
      break;
    case UserVerb::kType:
    case UserVerb::kKeyboard:
      Fail(line.place + ": nothing that a user does during a step");
    default:
      ActBesideTheDialog(line);
      break;
  }
}

// The lines that follow an action go to the step that it has started.
void TakeDuring() {
  std::deque<UserLine>& actions = user->script.actions;
  while (!actions.empty() && IsDuring(actions.front().verb)) {
    user->during.push_back(TakeFirst(&actions));
  }
}

void PostDuring() {
  std::deque<UserLine>& lines = user->during;
  while (!lines.empty()) {
    const UserLine& next = lines.front();
    if (next.verb == UserVerb::kUntilDuring && !IsRead(FromUtf8(next.detail))) return;
    ActDuringStep(TakeFirst(&lines));
  }
}

// Windows disables the owner for as long as a box or a picker stands.
class OwnerDisabled {
 public:
  OwnerDisabled() {
    if (OpenDialog() != nullptr) OpenDialog()->frame.style |= WS_DISABLED;
  }
  ~OwnerDisabled() {
    if (OpenDialog() != nullptr) OpenDialog()->frame.style &= ~uint32_t{WS_DISABLED};
  }
  OwnerDisabled(const OwnerDisabled&) = delete;
  OwnerDisabled& operator=(const OwnerDisabled&) = delete;
};

void DispatchAll() {
  while (DispatchNext()) {
  }
}

}  // namespace

bool LoadUser(const std::filesystem::path& script, std::string* error) {
  std::optional<UserScript> read = ReadUserScript(script, error);
  if (!read) return false;
  user.emplace().script = std::move(*read);
  TakeDuring();
  return true;
}

void SetUser(std::function<void()> turn) {
  user.emplace().turn = std::move(turn);
}

void ForgetUser() {
  user.reset();
}

bool HasUser() {
  return user.has_value();
}

void RequireUser() {
  if (!user) Fail("nobody can use the dialog: name a script of the user with MORIV_USER");
}

void TakeUserTurn() {
  DrawControls();
  if (user->turn) {
    user->turn();
    return;
  }
  if (!user->during.empty()) {
    // The step that these were meant for did not poll: they reach the idle dialog.
    Act(TakeFirst(&user->during));
    return;
  }
  std::deque<UserLine>& actions = user->script.actions;
  if (actions.empty()) Fail(user->script.file + ": the script ends while the dialog is open");
  const UserLine line = TakeFirst(&actions);
  // A click that follows is met by the first poll of what the action starts: inside its very
  // handler, or in the step that the handler has posted, behind which the click then waits.
  TakeDuring();
  Act(line);
  if (!OpenDialog()->hasEnded) PostDuring();
}

void UserAtPoll() {
  if (!user || OpenDialog() == nullptr) return;
  ++user->polls;
  std::vector<UserLine>& waiting = user->script.atPolls;
  const auto isNow = [](const UserLine& line) { return line.poll == user->polls; };
  std::vector<UserLine> now;
  std::ranges::copy_if(waiting, std::back_inserter(now), isNow);
  std::erase_if(waiting, isNow);
  for (const UserLine& line : now) ActDuringStep(line);
  PostDuring();
}

int AnswerBox(const std::string& caption, const std::string& text, UINT type,
              const std::string& look) {
  const std::string box = "box " + Quoted(caption) + " " + Quoted(text);
  const auto tell = [&](const std::string& answer) {
    TellUser(box + " " + answer);
    if (user->script.showsBoxes) TellUser("box-look " + look);
  };
  if ((type & MB_YESNO) == 0) {
    tell("ok");
    return IDOK;
  }
  if (user->turn) return IDYES;
  if (user->script.answers.empty()) Fail(user->script.file + ": no answer to " + box);
  const UserLine answer = TakeFirst(&user->script.answers);
  const OwnerDisabled modal;
  if (answer.verb == UserVerb::kAnswerLate) {
    PostDuring();
    DispatchAll();
  }
  tell(answer.detail);
  return answer.detail == "yes" ? IDYES : IDNO;
}

bool PickFolder(const std::string& prompt, std::string* path) {
  if (!user) return false;
  const std::string picker = "picker " + Quoted(prompt);
  if (user->script.picks.empty()) Fail(user->script.file + ": no answer to " + picker);
  const std::string picked = TakeFirst(&user->script.picks).detail;
  const OwnerDisabled modal;
  PostDuring();
  DispatchAll();
  TellUser(picker + " " + picked);
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
  const UserScript& script = user->script;
  for (const auto& left : {user->during, script.actions, script.answers, script.picks}) {
    if (!left.empty()) Fail(left.front().place + ": left over when the dialog ended");
  }
  if (!script.atPolls.empty()) {
    Fail(script.atPolls.front().place + ": the run polled " + std::to_string(user->polls) +
         " times only");
  }
}

}  // namespace machine

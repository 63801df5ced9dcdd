// The script of a user, as it stands in its file: one line an action, '#' begins a comment.
#pragma once

#include <deque>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

namespace machine {

enum class UserVerb {
  kWait,
  kPress,
  kClickDuring,
  kCloseDuring,
  kEscapeDuring,
  kUntilDuring,
  kType,
  kEscape,
  kClose,
  kShow,
  kShowFocus,
  kShowDrawn,
  kShowBoxes,
  kKeyboard,
  kKey,
  kAnswer,
  kAnswerLate,
  kPick,
};

struct UserLine {
  std::string place;  // "FILE:LINE: TEXT", for messages
  UserVerb verb = UserVerb::kWait;
  int control = 0;     // id, of the verbs that name a control; 0 for a "show" of the whole dialog
  std::string detail;  // UTF-8: what is typed or waited for, the key, the path, "yes", "no", "none"
  int poll = 0;        // of a line that belongs to the n-th poll of the run; 0 for the others
};

// Whether the line belongs to the step that the line before it has started.
bool IsDuring(UserVerb verb);

// Each kind of line in the script's order. Answers and picks are queues of their own: the n-th box
// takes the n-th answer, wherever it stands.
struct UserScript {
  std::string file;
  std::deque<UserLine> actions;
  std::deque<UserLine> answers;
  std::deque<UserLine> picks;
  std::vector<UserLine> atPolls;
  bool showsBoxes = false;  // how they look, too
};

// nullopt, with "FILE:LINE: what" in `error`, for a line that is none.
std::optional<UserScript> ReadUserScript(const std::filesystem::path& file, std::string* error);

}  // namespace machine

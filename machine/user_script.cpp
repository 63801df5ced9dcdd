#include "machine/user_script.h"

#include <algorithm>
#include <cstdlib>
#include <fstream>

#include "machine/dialog_keys.h"

namespace machine {
namespace {

// What stands behind a verb.
enum class Operand { kNone, kControl, kPerhapsControl, kControlAndText, kYesOrNo, kKey, kText };

struct VerbForm {
  const char* name;
  UserVerb verb;
  Operand operand;
};

constexpr VerbForm kVerbs[] = {
    {"wait", UserVerb::kWait, Operand::kNone},
    {"press", UserVerb::kPress, Operand::kControl},
    {"click-during", UserVerb::kClickDuring, Operand::kControl},
    {"close-during", UserVerb::kCloseDuring, Operand::kNone},
    {"escape-during", UserVerb::kEscapeDuring, Operand::kNone},
    {"until-during", UserVerb::kUntilDuring, Operand::kText},
    {"type", UserVerb::kType, Operand::kControlAndText},
    {"escape", UserVerb::kEscape, Operand::kNone},
    {"close", UserVerb::kClose, Operand::kNone},
    {"show", UserVerb::kShow, Operand::kPerhapsControl},
    {"show-focus", UserVerb::kShowFocus, Operand::kNone},
    {"show-drawn", UserVerb::kShowDrawn, Operand::kNone},
    {"show-boxes", UserVerb::kShowBoxes, Operand::kNone},
    {"keyboard", UserVerb::kKeyboard, Operand::kKey},
    {"key", UserVerb::kKey, Operand::kText},
    {"answer", UserVerb::kAnswer, Operand::kYesOrNo},
    {"answer-late", UserVerb::kAnswerLate, Operand::kYesOrNo},
    {"pick", UserVerb::kPick, Operand::kText},
};

// Takes the first word off, with the one blank behind it.
std::string TakeWord(std::string* text) {
  const size_t end = std::min(text->find(' '), text->size());
  std::string word = text->substr(0, end);
  text->erase(0, std::min(end + 1, text->size()));
  return word;
}

bool TakeNumber(std::string* text, int* number) {
  constexpr size_t kMostDigits = 6;
  const std::string word = TakeWord(text);
  const bool isNumber = !word.empty() && word.size() <= kMostDigits &&
                        word.find_first_not_of("0123456789") == std::string::npos;
  if (isNumber) *number = std::atoi(word.c_str());
  return isNumber;
}

bool TakeOperand(Operand operand, std::string text, UserLine* line) {
  switch (operand) {
    case Operand::kNone:
      return text.empty();
    case Operand::kPerhapsControl:
      if (text.empty()) return true;
      [[fallthrough]];
    case Operand::kControl:
      return TakeNumber(&text, &line->control) && text.empty();
    case Operand::kControlAndText:
      if (!TakeNumber(&text, &line->control)) return false;
      line->detail = text;
      return true;
    case Operand::kYesOrNo:
      line->detail = text;
      return text == "yes" || text == "no";
    case Operand::kKey:
      line->detail = text;
      return IsKey(text);
    case Operand::kText:
      line->detail = text;
      return !text.empty();
  }
  return false;
}

bool ParseLine(std::string text, UserLine* line) {
  if (text.starts_with("at-poll ")) {
    TakeWord(&text);
    if (!TakeNumber(&text, &line->poll) || line->poll == 0) return false;
  }
  const std::string name = TakeWord(&text);
  const auto* const form =
      std::ranges::find_if(kVerbs, [&name](const VerbForm& verb) { return name == verb.name; });
  if (form == std::end(kVerbs)) return false;
  line->verb = form->verb;
  return TakeOperand(form->operand, text, line);
}

bool IsAnswer(UserVerb verb) {
  return verb == UserVerb::kAnswer || verb == UserVerb::kAnswerLate;
}

// False for an answer that is to wait for a poll: those wait for their question.
bool Sort(const UserLine& line, UserScript* script) {
  const bool isQueued = IsAnswer(line.verb) || line.verb == UserVerb::kPick;
  if (line.poll > 0) {
    script->atPolls.push_back(line);
    return !isQueued && line.verb != UserVerb::kShowBoxes;
  }
  if (line.verb == UserVerb::kShowBoxes) {
    script->showsBoxes = true;
    return true;
  }
  std::deque<UserLine>& queue = IsAnswer(line.verb)            ? script->answers
                                : line.verb == UserVerb::kPick ? script->picks
                                                               : script->actions;
  queue.push_back(line);
  return true;
}

}  // namespace

bool IsDuring(UserVerb verb) {
  return verb == UserVerb::kClickDuring || verb == UserVerb::kCloseDuring ||
         verb == UserVerb::kEscapeDuring || verb == UserVerb::kUntilDuring;
}

std::optional<UserScript> ReadUserScript(const std::filesystem::path& file, std::string* error) {
  UserScript script;
  script.file = file.string();
  std::ifstream stream(file);
  if (!stream) {
    *error = script.file + ": can't be read";
    return std::nullopt;
  }
  std::string text;
  for (int number = 1; std::getline(stream, text); ++number) {
    if (!text.empty() && text.back() == '\r') text.pop_back();
    text.erase(0, std::min(text.find_first_not_of(" \t"), text.size()));
    if (text.empty() || text.front() == '#') continue;
    UserLine line;
    line.place = script.file + ":" + std::to_string(number) + ": " + text;
    if (!ParseLine(text, &line) || !Sort(line, &script)) {
      *error = line.place + ": not a line of a user's script";
      return std::nullopt;
    }
  }
  return script;
}

}  // namespace machine

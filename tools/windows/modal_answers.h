// The message boxes and folder pickers above the dialog, and what the user answers to them.
#pragma once

#include <windows.h>
// After windows.h.
#include <deque>
#include <string>

#include "tools/windows/dialog_view.h"

// A line of the user's script.
struct Line {
  std::string verb;
  std::string rest;
};

// Each kind is a queue of its own: the n-th box gets the n-th answer of the script.
struct ModalAnswers {
  std::deque<Line> answers;
  std::deque<Line> picks;
  std::deque<Line> pictures;  // to be taken of the next box; none need be left
  bool showsBoxes = false;    // how they look, too

  // Takes a line that belongs here; false for any other.
  bool Take(const Line& line);
  bool AreLeft() const { return !answers.empty() || !picks.empty(); }
};

// Answers the box or picker that stands, and waits until it is gone. No answer is a failure.
void AnswerModal(const ProgramWindows& windows, ModalAnswers* given);

// The user of a dialog run: a script, the file that MORIV_USER names.
//
// Its lines are carried out in order, each when the dialog is idle: no message waits and no handler
// runs. The answers to message boxes and folder pickers are queues of their own. What the user sees
// goes to standard output. A script that doesn't fit the run ends the process with exit status 2.
#pragma once

#include <filesystem>
#include <functional>
#include <string>

#include "platform/win32.h"

namespace machine {

// Reads the script. False with "FILE:LINE: what" in `error`.
bool LoadUser(const std::filesystem::path& script, std::string* error);
// A user without a script, who decides: `turn` is called each time that the dialog is idle, and a
// question is answered with yes.
void SetUser(std::function<void()> turn);
// Back to a machine without a user.
void ForgetUser();

bool HasUser();

// Ends the process with a message and exit status 2 when there is nobody to use a dialog.
void RequireUser();

// The dialog is idle: the user's next line.
void TakeUserTurn();

// The program polls for messages inside a running step.
void UserAtPoll();

// The user's answer to a message box, given at once or when all that was posted is dispatched.
// `look` is shown to a user who looks at that too.
int AnswerBox(const std::string& caption, const std::string& text, UINT type,
              const std::string& look);

// What the user picks in a folder picker; false for none.
bool PickFolder(const std::string& prompt, std::string* path);

// Tells of something that the program asked of the system: a line of standard output.
void TellUser(const std::string& line);

// The text in double quotes, in UTF-8, with \r \n \" and \\ escaped.
std::string Quoted(const std::string& text);

// Called when the dialog has ended: what is left of the script makes the run a failure.
void EndUser();

}  // namespace machine

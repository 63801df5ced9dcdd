// The keyboard of an idle dialog: what Windows' dialog manager makes of it (IsDialogMessage).
#pragma once

#include <string>

namespace machine {

// "TAB", "SHIFT+TAB", "ENTER", "SPACE", or in quotes a text to be typed, as a user's script has
// them.
bool IsKey(const std::string& key);

// TAB moves the focus to the next control that takes it, in order and round the end; text in an
// edit field is then selected. The default button's looks go along to a button; behind any other
// control they go back to the button of the dialog's default id, if there is one.
//
// ENTER gives the command of the button with the focus, if that has the default one's looks; else
// that of the dialog's default id, else of the first button with these looks, else IDOK. A
// disabled control of that id stops it.
//
// SPACE presses the button with the focus. A text, in UTF-8, replaces the selection of the edit
// field with the focus, one character after the other.
//
// False when the focus is on nothing that takes the key.
bool PressKey(const std::string& key);

}  // namespace machine

// Texts from elsewhere (packages, logs, names of files, command lines) on their way to a terminal.
//
// A control character there can move the cursor, recolour or retitle the window; a direction mark
// can make one name look like another. Neither gets through.
#pragma once

#include <string>
#include <string_view>

namespace terminal {

// The text, UTF-8, with \uNNNN, as JSON has it, for every control character (C0, 0x7F, C1), line
// and paragraph separator, direction mark and other character that shows nothing, and \xNN for a
// byte that is no UTF-8. A text that has been through it comes back as it is.
std::string Printable(std::string_view utf8);

// The same between quotes.
std::string Quoted(std::string_view utf8);

// The same for a text of several lines: its LFs stay.
std::string PrintableLines(std::string_view utf8);

}  // namespace terminal

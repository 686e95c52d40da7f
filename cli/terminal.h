// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_TERMINAL_H
#define TAVIWIRELESS_CLI_TERMINAL_H

#include <string>

namespace taviwireless::cli {

// The text as the terminal can show it: what steers a terminal, is no UTF-8, or cannot be shown is
// "?". All text that comes from elsewhere goes through this.
std::string Printable(const std::string& text);

// Columns of the terminal that standard output is; 0 when it is none.
int TerminalWidth();

// Whether characters beyond ASCII can be shown, by LC_ALL, LC_CTYPE and LANG.
bool ShowsUTF8();

// Whether a descriptor is a terminal on which escape sequences move the cursor (TERM).
bool TakesEscapes(int descriptor);

enum class Colour { kGood, kWarning, kBad, kFaint, kBold };
// The text in a colour, where standard output is a terminal that has some and its user wants them
// (NO_COLOR, TERM); otherwise the text.
std::string Coloured(Colour colour, const std::string& text);

// Shows on standard error what is being waited for, such as "Joining HOME ...", and counts the
// seconds behind it. Another text replaces it; the empty text removes it. Nothing is shown unless
// standard error is a terminal.
void ShowProgress(const std::string& text);

// Removes it, and ends the thread that counts: a child that is forked would not have it.
void EndProgress();

// Reads one line from standard input: at a terminal behind a prompt and without echo, so that it
// appears neither on the screen nor in a process list; a signal restores the echo. Throws
// CommandError when there is none.
std::string ReadSecret(const std::string& prompt);

// ReadSecret, at a terminal twice: throws CommandError unless both are the same.
std::string ReadNewSecret(const std::string& prompt);

// Asks a question at the terminal; true when the answer is "yes". When standard input is no
// terminal, throws CommandError with the sentence withoutTerminal.
bool Confirm(const std::string& question, const std::string& withoutTerminal);

}  // namespace taviwireless::cli

#endif

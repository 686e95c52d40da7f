#ifndef TAVIWIRELESS_CLI_TERMINAL_H
#define TAVIWIRELESS_CLI_TERMINAL_H

#include <string>

namespace taviwireless::cli {

// Returns text with control characters replaced by "?": what a modem sends may not steer the
// terminal.
std::string Printable(const std::string& text);

// Columns of the terminal that standard output is; 0 when it is none.
int TerminalWidth();

// Whether characters beyond ASCII can be shown on standard output.
bool ShowsUTF8();

enum class Colour { kGood, kWarning, kBad, kFaint, kBold };
// The text in a colour, where standard output is a terminal that has some and its user wants them
// (NO_COLOR, TERM); otherwise the text.
std::string Coloured(Colour colour, const std::string& text);

// Shows on standard error what is being waited for, one line that each call replaces; the empty
// text removes it. Nothing is shown unless standard error is a terminal.
void ShowProgress(const std::string& text);

// Reads one line from standard input: at a terminal behind a prompt and without echo, so that it
// appears neither on the screen nor in a process list. Throws CommandError when there is none.
std::string ReadSecret(const std::string& prompt);

// ReadSecret, at a terminal twice: throws CommandError unless both are the same.
std::string ReadNewSecret(const std::string& prompt);

// Asks a question at the terminal; true when the answer is "yes". When standard input is no
// terminal, throws CommandError with the sentence withoutTerminal.
bool Confirm(const std::string& question, const std::string& withoutTerminal);

}  // namespace taviwireless::cli

#endif

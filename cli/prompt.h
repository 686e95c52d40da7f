#ifndef TAVIWIRELESS_CLI_PROMPT_H
#define TAVIWIRELESS_CLI_PROMPT_H

#include <string>

namespace taviwireless::cli {

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

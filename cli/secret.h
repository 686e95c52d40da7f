#ifndef TAVIWIRELESS_CLI_SECRET_H
#define TAVIWIRELESS_CLI_SECRET_H

#include <string>

namespace taviwireless::cli {

// Reads one line from standard input: at a terminal behind a prompt and without echo, so that it
// appears neither on the screen nor in a process list. Throws CommandError when there is none.
std::string ReadSecret(const std::string& prompt);

}  // namespace taviwireless::cli

#endif

// SPDX-License-Identifier: MIT
// What is asked at the terminal, or read from a pipe.
#include <bsd/readpassphrase.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <iostream>

#include "cli/command_error.h"
#include "cli/deadline.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

std::string ReadLine(const std::string& what) {
    std::string line;
    if (!std::getline(std::cin, line)) {
        throw CommandError(kFailure, "standard input ended before there was a line for: " + what);
    }
    return line;
}

}  // namespace

std::string ReadSecret(const std::string& prompt) {
    const Untimed untimed;
    ShowProgress("");
    if (isatty(STDIN_FILENO) == 0) {
        return ReadLine(prompt);
    }
    char line[4096];  // longer than a terminal's line
    if (readpassphrase((prompt + ": ").c_str(), line, sizeof line, RPP_REQUIRE_TTY) == nullptr) {
        throw CommandError(kFailure, "cannot read from the terminal (" +
                                         std::string(strerror(errno)) +
                                         "); a pipe can give a line for: " + prompt);
    }
    const std::string secret = line;
    explicit_bzero(line, sizeof line);
    return secret;
}

std::string ReadNewSecret(const std::string& prompt) {
    const std::string secret = ReadSecret(prompt);
    if (isatty(STDIN_FILENO) && ReadSecret(prompt + " again") != secret) {
        throw CommandError(kUsage, "the two differ; nothing was changed");
    }
    return secret;
}

bool Confirm(const std::string& question, const std::string& withoutTerminal) {
    if (!isatty(STDIN_FILENO)) {
        throw CommandError(kFailure, withoutTerminal);
    }
    const Untimed untimed;
    ShowProgress("");
    std::cerr << question << " [yes/no] ";
    std::string answer;
    return std::getline(std::cin, answer) && answer == "yes";
}

}  // namespace taviwireless::cli

#include "cli/secret.h"

#include <termios.h>
#include <unistd.h>

#include <iostream>

#include "cli/commands.h"

namespace taviwireless::cli {

namespace {

// Switches the terminal's echo off while it lives.
class NoEcho {
  public:
    NoEcho() : isTerminal_(tcgetattr(STDIN_FILENO, &settings_) == 0) {
        if (isTerminal_) {
            termios silent = settings_;
            silent.c_lflag &= ~static_cast<tcflag_t>(ECHO);
            tcsetattr(STDIN_FILENO, TCSAFLUSH, &silent);
        }
    }
    ~NoEcho() {
        if (isTerminal_) {
            tcsetattr(STDIN_FILENO, TCSAFLUSH, &settings_);
            std::cerr << '\n';
        }
    }
    NoEcho(const NoEcho&) = delete;
    NoEcho& operator=(const NoEcho&) = delete;

  private:
    termios settings_{};
    bool isTerminal_;
};

}  // namespace

std::string ReadSecret(const std::string& prompt) {
    if (isatty(STDIN_FILENO)) {
        std::cerr << prompt << ": ";
    }
    const NoEcho noEcho;
    std::string secret;
    if (!std::getline(std::cin, secret)) {
        throw CommandError(kFailure, "standard input ended before there was a line for: " + prompt);
    }
    return secret;
}

}  // namespace taviwireless::cli

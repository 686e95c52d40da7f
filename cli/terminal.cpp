#include "cli/terminal.h"

#include <langinfo.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>

#include "cli/command_error.h"

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

std::string Printable(const std::string& text) {
    std::string printable;
    for (size_t i = 0; i < text.size(); ++i) {
        const auto byte = static_cast<unsigned char>(text[i]);
        const auto next = static_cast<unsigned char>(text[i + 1]);      // zero at the end
        const bool isC1 = byte == 0xC2 && next >= 0x80 && next < 0xA0;  // in UTF-8, two bytes
        printable += byte < 0x20 || byte == 0x7F || isC1 ? '?' : text[i];
        i += isC1 ? 1 : 0;
    }
    return printable;
}

int TerminalWidth() {
    winsize size{};
    return isatty(STDOUT_FILENO) && ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 ? size.ws_col : 0;
}

bool ShowsUTF8() {
    return strcmp(nl_langinfo(CODESET), "UTF-8") == 0;
}

std::string Coloured(Colour colour, const std::string& text) {
    constexpr const char* kCodes[] = {"32", "33", "31", "2", "1"};
    const char* terminal = getenv("TERM");
    const char* unwanted = getenv("NO_COLOR");
    if (!isatty(STDOUT_FILENO) || terminal == nullptr || strcmp(terminal, "dumb") == 0 ||
        (unwanted != nullptr && *unwanted != '\0')) {
        return text;
    }
    return std::string("\033[") + kCodes[static_cast<int>(colour)] + "m" + text + "\033[0m";
}

void ShowProgress(const std::string& text) {
    if (isatty(STDERR_FILENO)) {
        std::fprintf(stderr, "\r\033[K%s", text.c_str());
    }
}

std::string ReadSecret(const std::string& prompt) {
    if (isatty(STDIN_FILENO)) {
        ShowProgress("");
        std::cerr << prompt << ": ";
    }
    const NoEcho noEcho;
    std::string secret;
    if (!std::getline(std::cin, secret)) {
        throw CommandError(kFailure, "standard input ended before there was a line for: " + prompt);
    }
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
    ShowProgress("");
    std::cerr << question << " [yes/no] ";
    std::string answer;
    return std::getline(std::cin, answer) && answer == "yes";
}

}  // namespace taviwireless::cli

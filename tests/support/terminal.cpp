// SPDX-License-Identifier: MIT
#include "tests/support/terminal.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <pty.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>
#include <utmp.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <system_error>
#include <thread>

#include "tests/support/files.h"
#include "tests/support/process.h"

namespace taviwireless::test {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kRunning = -1;

}  // namespace

Terminal::Terminal(const std::vector<std::string>& argv, unsigned short columns) {
    std::vector<char*> arguments;
    for (const auto& argument : argv) {
        arguments.push_back(const_cast<char*>(argument.c_str()));
    }
    arguments.push_back(nullptr);
    const winsize size{24, columns, 0, 0};
    int master;
    int slave;
    if (openpty(&master, &slave, nullptr, nullptr, &size) != 0) {
        throw std::system_error(errno, std::generic_category(), "Cannot open a terminal");
    }
    master_ = UniqueFd(master);
    slave_ = UniqueFd(slave);
    pid_ = fork();
    if (pid_ == 0) {
        close(master);
        login_tty(slave);
        execvp(arguments[0], arguments.data());
        _exit(127);
    }
}

Terminal::~Terminal() {
    Signal(SIGKILL);
    Wait();
}

void Terminal::Type(const std::string& text) const {
    EXPECT_EQ(write(master_.Get(), text.data(), text.size()), static_cast<ssize_t>(text.size()));
}

void Terminal::Signal(int number) const {
    if (status_ == kRunning) {
        kill(pid_, number);
    }
}

bool Terminal::Echoes() const {
    termios settings{};
    EXPECT_EQ(tcgetattr(master_.Get(), &settings), 0);
    return (settings.c_lflag & ECHO) != 0;
}

// Returns whether there was anything to read.
bool Terminal::Read() {
    char buffer[4096];
    pollfd readable{master_.Get(), POLLIN, 0};
    const ssize_t count =
        poll(&readable, 1, 10) > 0 ? read(master_.Get(), buffer, sizeof buffer) : 0;
    shown_.append(buffer, count > 0 ? static_cast<size_t>(count) : 0);
    return count > 0;
}

bool Terminal::HasEnded() {
    int status;
    if (status_ == kRunning && waitpid(pid_, &status, WNOHANG) == pid_) {
        status_ = WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
    }
    return status_ != kRunning;
}

bool Terminal::Await(const std::string& text) {
    const auto deadline = Clock::now() + Process::kPatience;
    size_t place;
    while ((place = shown_.find(text, awaited_)) == std::string::npos) {
        const bool hasEnded = HasEnded();
        if (!Read() && (hasEnded || Clock::now() > deadline)) {
            return false;
        }
    }
    awaited_ = place + text.size();
    return true;
}

bool Terminal::AwaitPrompt(const std::string& text) {
    const bool isShown = Await(text);
    const std::string status = "/proc/" + std::to_string(pid_) + "/status";
    while (isShown && !HasEnded() && ReadFile(status).find("State:\tS") == std::string::npos) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return isShown;
}

int Terminal::Wait() {
    const auto deadline = Clock::now() + Process::kPatience;
    for (bool hasEnded = false; !hasEnded || Read();) {
        hasEnded = HasEnded();
        Read();
        if (Clock::now() > deadline) {
            ADD_FAILURE() << "it has not ended within 50 s: " << shown_;
            Signal(SIGKILL);
            return -1;
        }
    }
    return status_;
}

}  // namespace taviwireless::test

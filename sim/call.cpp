// SPDX-License-Identifier: MIT
#include "sim/call.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>

// glibc 2.36 does not declare these as C functions itself.
extern "C" {
#include <sys/pidfd.h>
}

namespace taviwireless::sim {
namespace {

constexpr int kPatience = 3000;  // ms for the command to say goodbye over the line

// This program's end of the line never blocks; the command's, which is the same, is as usual.
void SetBlocking(int line, bool blocks) {
    const int flags = fcntl(line, F_GETFL);
    fcntl(line, F_SETFL, blocks ? flags & ~O_NONBLOCK : flags | O_NONBLOCK);
}

[[noreturn]] void Become(const std::string& command, int line) {
    setpgid(0, 0);  // no session: its end would hang the line up, for this program as well
    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
    signal(SIGPIPE, SIG_DFL);
    dup2(line, STDIN_FILENO);
    dup2(line, STDOUT_FILENO);
    execl("/bin/sh", "sh", "-c", command.c_str(), nullptr);
    _exit(127);
}

}  // namespace

Call::Call(const std::string& command, int line) : line_(line) {
    SetBlocking(line_, true);
    process_ = fork();
    if (process_ == 0) {
        Become(command, line);
    }
    handle_ = UniqueFd(process_ > 0 ? pidfd_open(process_, 0) : -1);
    if (handle_.Get() < 0) {
        const std::string reason = std::strerror(errno);
        if (process_ > 0) {
            kill(-process_, SIGKILL);
            waitpid(process_, nullptr, 0);
        }
        SetBlocking(line_, false);
        throw std::runtime_error("Cannot run " + command + ": " + reason + ".");
    }
}

Call::~Call() {
    kill(-process_, SIGTERM);
    pollfd ended{Get(), POLLIN, 0};
    if (poll(&ended, 1, kPatience) == 0) {
        kill(-process_, SIGKILL);
    }
    waitpid(process_, nullptr, 0);
    SetBlocking(line_, false);
}

bool Call::HasEnded() const {
    pollfd ended{Get(), POLLIN, 0};
    return poll(&ended, 1, 0) > 0;
}

}  // namespace taviwireless::sim

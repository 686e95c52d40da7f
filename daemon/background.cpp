// SPDX-License-Identifier: MIT
#include "daemon/background.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <system_error>
#include <utility>

#include "base/unique_pipe.h"

namespace taviwireless::daemon {

namespace {

[[noreturn]] void WaitForReady(UniquePipe& pipe, pid_t child) {
    if (pipe.ReadByte()) {
        _exit(EXIT_SUCCESS);
    }
    int status = 0;
    waitpid(child, &status, 0);
    _exit(WIFEXITED(status) ? WEXITSTATUS(status) : EXIT_FAILURE);
}

}  // namespace

Background::Background() {
    UniquePipe pipe;
    const pid_t child = pipe ? fork() : -1;
    if (child < 0) {
        throw std::system_error(errno, std::generic_category(), "cannot go into the background");
    }
    if (child > 0) {
        WaitForReady(pipe, child);
    }
    ready_ = std::move(pipe.writeEnd);
    setsid();
}

void Background::Ready() {
    const UniqueFd nothing(open("/dev/null", O_RDWR | O_CLOEXEC));
    for (const int standard : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        dup2(nothing.Get(), standard);
    }
    (void)!chdir("/");
    (void)!write(ready_.Get(), "", 1);
    ready_.Close();
}

}  // namespace taviwireless::daemon

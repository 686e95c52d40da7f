#include "daemon/background.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <system_error>

namespace taviwireless::daemon {

namespace {

[[noreturn]] void WaitForReady(int ready, pid_t child) {
    char byte;
    ssize_t size;
    while ((size = read(ready, &byte, 1)) < 0 && errno == EINTR) {
    }
    if (size == 1) {
        _exit(EXIT_SUCCESS);
    }
    int status = 0;
    waitpid(child, &status, 0);
    _exit(WIFEXITED(status) ? WEXITSTATUS(status) : EXIT_FAILURE);
}

}  // namespace

Background::Background() {
    int ends[2];
    const bool hasPipe = pipe2(ends, O_CLOEXEC) == 0;
    const pid_t child = hasPipe ? fork() : -1;
    if (child < 0) {
        throw std::system_error(errno, std::generic_category(), "cannot go into the background");
    }
    if (child > 0) {
        close(ends[1]);
        WaitForReady(ends[0], child);
    }
    close(ends[0]);
    ready_ = ends[1];
    setsid();
}

void Background::Ready() {
    const int nothing = open("/dev/null", O_RDWR | O_CLOEXEC);
    for (const int standard : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        dup2(nothing, standard);
    }
    close(nothing);
    (void)!chdir("/");
    (void)!write(ready_, "", 1);
    close(ready_);
}

}  // namespace taviwireless::daemon

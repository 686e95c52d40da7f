// SPDX-License-Identifier: MIT
#include "wireless/system/shell.h"

#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

#include "base/spawn_settings.h"
#include "base/unique_pipe.h"
#include "common/log.h"

namespace taviwireless::wireless {

namespace {

// Returns the character, quoted if a shell could act on it. Blanks are not: they still split.
std::string Quoted(char c) {
    constexpr char kActive[] = "|&;<>()$`\\\"'*?[]#~=%!{}^";
    if (c == '\n') {
        return "'\n'";  // behind a backslash it would vanish
    }
    const bool isActive = c != '\0' && std::string(kActive).find(c) != std::string::npos;
    return isActive ? std::string("\\") + c : std::string(1, c);
}

// Waits for the process's end and returns its status. Where the caller ignores SIGCHLD, waitpid
// waits as well, but has no status to give.
int Wait(pid_t process) {
    int status = -1;
    while (waitpid(process, &status, 0) < 0 && errno == EINTR) {
    }
    return status;
}

// For a stream that reads through signals: one of fdopen() takes a caught signal for the end.
ssize_t ReadOn(void* descriptor, char* buffer, size_t size) {
    ssize_t count = -1;
    do {
        count = read(static_cast<UniqueFd*>(descriptor)->Get(), buffer, size);
    } while (count < 0 && errno == EINTR);
    return count;
}

}  // namespace

Command::Command(size_t size, std::initializer_list<Part> parts) {
    for (const Part& part : parts) {
        for (const char c : part.text) {
            if (described_.size() + 1 == size) {
                fits_ = false;
                return;
            }
            described_ += part.isSecret ? '*' : c;
            text_ += part.isArgument ? Quoted(c) : std::string(1, c);
        }
    }
}

bool Command::Run(Output output, const char* file, int line) const {
    const pid_t process = fits_ ? Start(output, -1) : -1;
    if (process < 0) {
        WriteLog(LOG_ERR, file, line, "Failed to execute '%s'", described_.c_str());
        return false;
    }
    Wait(process);
    return true;
}

pid_t Command::Start(Output output, int pipe) const {
    SpawnSettings settings;
    if (pipe >= 0) {
        settings.Duplicate(pipe, STDOUT_FILENO);
    }
    if (output == Output::kDropped) {
        settings.OpenNothing(STDOUT_FILENO);
        settings.OpenNothing(STDERR_FILENO);
    }
    settings.OpenNothing(STDIN_FILENO);
    settings.StartInRootFolder();
    settings.InheritNothingElse();
    const char* arguments[] = {"sh", "-c", text_.c_str(), nullptr};
    return settings.Spawn("/bin/sh", arguments);
}

Pipe::Pipe(const Command& command) {
    if (!command.fits_) {
        errno = E2BIG;
        return;
    }
    UniquePipe ends;
    process_ = ends ? command.Start(Output::kShown, ends.writeEnd.Get()) : -1;
    if (process_ >= 0) {
        readEnd_ = std::move(ends.readEnd);
        cookie_io_functions_t functions{};
        functions.read = ReadOn;
        file_.reset(fopencookie(&readEnd_, "r", functions));
    }
}

int Pipe::Close() {
    file_.reset();
    readEnd_.Close();
    const int status = process_ >= 0 ? Wait(std::exchange(process_, -1)) : -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace taviwireless::wireless

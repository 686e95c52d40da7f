#include "wireless/system/shell.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

#include "base/spawn_settings.h"
#include "base/unique_fd.h"
#include "common/log.h"

namespace taviwireless::wireless {

namespace {

// A quote for every character that a shell could act on; blanks still split.
std::string Quoted(char c) {
    constexpr char kActive[] = "|&;<>()$`\\\"'*?[]#~=%!{}^";
    if (c == '\n') {
        return "'\n'";  // behind a backslash it would vanish
    }
    const bool isActive = c != '\0' && std::string(kActive).find(c) != std::string::npos;
    return isActive ? std::string("\\") + c : std::string(1, c);
}

// A caller that ignores SIGCHLD has no child to wait for when this returns, but it did wait.
int Wait(pid_t process) {
    int status = -1;
    while (waitpid(process, &status, 0) < 0 && errno == EINTR) {
    }
    return status;
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
    int ends[2];
    if (!command.fits_ || pipe2(ends, O_CLOEXEC) != 0) {
        errno = command.fits_ ? errno : E2BIG;
        return;
    }
    UniqueFd readEnd(ends[0]);
    const UniqueFd writeEnd(ends[1]);
    process_ = command.Start(Output::kShown, writeEnd.Get());
    if (process_ >= 0) {
        file_ = fdopen(readEnd.Get(), "r");
    }
    if (file_ != nullptr) {
        readEnd.Release();
    }
}

int Pipe::Close() {
    if (file_ != nullptr) {
        fclose(std::exchange(file_, nullptr));
    }
    const int status = process_ >= 0 ? Wait(std::exchange(process_, -1)) : -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace taviwireless::wireless

#include "wireless/shell.h"

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <new>
#include <utility>

#include "base/unique_fd.h"
#include "common/log.h"

namespace taviwireless::wireless {

namespace {

constexpr int kFirstPrivateDescriptor = 3;

// A quote for every character that a shell could act on; blanks still split.
std::string Quoted(char c) {
    constexpr char kActive[] = "|&;<>()$`\\\"'*?[]#~=%!{}^";
    if (c == '\n') {
        return "'\n'";  // behind a backslash it would vanish
    }
    const bool isActive = c != '\0' && std::string(kActive).find(c) != std::string::npos;
    return isActive ? std::string("\\") + c : std::string(1, c);
}

// How a command starts. Nothing of it may be left out when memory is short.
class SpawnSettings {
  public:
    SpawnSettings() {
        sigset_t none;
        sigset_t all;
        sigemptyset(&none);
        sigfillset(&all);
        posix_spawnattr_init(&attributes_);
        posix_spawnattr_setflags(&attributes_, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
        posix_spawnattr_setsigmask(&attributes_, &none);
        posix_spawnattr_setsigdefault(&attributes_, &all);
        posix_spawn_file_actions_init(&actions_);
    }
    ~SpawnSettings() {
        posix_spawn_file_actions_destroy(&actions_);
        posix_spawnattr_destroy(&attributes_);
    }
    SpawnSettings(const SpawnSettings&) = delete;
    SpawnSettings& operator=(const SpawnSettings&) = delete;

    void Duplicate(int from, int to) {
        Require(posix_spawn_file_actions_adddup2(&actions_, from, to));
    }
    void OpenNothing(int descriptor) {
        Require(posix_spawn_file_actions_addopen(&actions_, descriptor, "/dev/null", O_RDWR, 0));
    }
    void InheritNothingElse() {
        Require(posix_spawn_file_actions_addclosefrom_np(&actions_, kFirstPrivateDescriptor));
        Require(posix_spawn_file_actions_addchdir_np(&actions_, "/"));
    }

    // The process; negative, with errno, when there is none.
    pid_t Spawn(const char* command) const {
        const char* arguments[] = {"sh", "-c", command, nullptr};
        pid_t process = -1;
        errno = posix_spawn(&process, "/bin/sh", &actions_, &attributes_,
                            const_cast<char* const*>(arguments), environ);
        return errno == 0 ? process : -1;
    }

  private:
    static void Require(int error) {
        if (error != 0) {
            throw std::bad_alloc();
        }
    }

    posix_spawnattr_t attributes_;
    posix_spawn_file_actions_t actions_;
};

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
    settings.InheritNothingElse();
    return settings.Spawn(text_.c_str());
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

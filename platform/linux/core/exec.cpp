// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <tavicore/process.h>
#include <unistd.h>

#include <cerrno>
#include <cstdarg>
#include <vector>

#include "base/close_all_from.h"
#include "base/spawn_settings.h"
#include "child_report.h"
#include "failure.h"

namespace {

using namespace tavicore;
using taviwireless::CloseAllFrom;
using taviwireless::SpawnSettings;

constexpr int kFirstPrivateDescriptor = 3;

// Told instead of an exit status.
constexpr int kNotRun = -1;
constexpr int kKilled = -2;

// Runs the program in this child of the caller and tells how it ended. The caller may ignore
// SIGCHLD, and then nobody learns how a child of its own ended.
[[noreturn]] void RunAndTell(const SpawnSettings& settings, const char* program,
                             char* const* arguments, int writeEnd) {
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_SETMASK, &all,
                nullptr);  // the caller's handlers are not meant for this process
    signal(SIGCHLD, SIG_DFL);
    // Nothing of the caller's is kept open, by this process or by the program.
    dup2(writeEnd, kFirstPrivateDescriptor);
    fcntl(kFirstPrivateDescriptor, F_SETFD, FD_CLOEXEC);
    CloseAllFrom(kFirstPrivateDescriptor + 1);

    int told = kNotRun;
    const pid_t child = settings.Spawn(program, arguments);
    if (child > 0) {
        int status = 0;
        pid_t ended;
        while ((ended = waitpid(child, &status, 0)) < 0 && errno == EINTR) {
        }
        const bool isKnown = ended == child;
        told = isKnown && WIFEXITED(status) ? WEXITSTATUS(status) : kKilled;
    }
    _exit(ChildReport::Tell(kFirstPrivateDescriptor, told) ? 0 : 1);
}

}  // namespace

int VEXACExec(const char* program, ...) {
    va_list list;
    va_start(list, program);
    const int result = Guarded(-1, [&] {
        RequireAll(program);
        std::vector<char*> arguments{const_cast<char*>(program)};
        do {
            arguments.push_back(va_arg(list, char*));
        } while (arguments.back() != nullptr);

        SpawnSettings settings;
        settings.OpenNothing(STDIN_FILENO);
        ChildReport report;
        const pid_t between = fork();
        if (between == 0) {
            RunAndTell(settings, program, arguments.data(), report.WriteEnd());
        }
        if (between < 0) {
            throw Failure{VEXAC_ERR_FORK_FAILED};
        }
        const int told = report.Hear().value_or(kKilled);
        while (waitpid(between, nullptr, 0) < 0 && errno == EINTR) {
        }
        if (told < 0) {
            throw Failure{told == kNotRun ? VEXAC_ERR_NOT_FOUND : VEXAC_ERR_IO};
        }
        return told;
    });
    va_end(list);
    return result;
}

#include "platform/root/appliance_root.h"

#include <poll.h>
#include <sched.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <exception>
#include <fstream>
#include <string>
#include <system_error>

#include "platform/root/private_system.h"

namespace taviwireless {
namespace {

[[noreturn]] void Fail(const std::string& sentence) {
    throw std::system_error(errno, std::generic_category(), "appliance root: " + sentence);
}

void WriteMap(const char* path, const std::string& text) {
    std::ofstream file(path);
    if (!file.write(text.data(), text.size()).flush()) {
        Fail(std::string("cannot write ") + path);
    }
}

// Makes the namespaces; true when a user namespace had to come first.
bool LeaveNamespaces() {
    constexpr int kNamespaces = CLONE_NEWNS | CLONE_NEWNET | CLONE_NEWIPC | CLONE_NEWPID;
    if (unshare(kNamespaces) == 0) {
        return false;
    }
    const std::string user = std::to_string(geteuid());
    const std::string group = std::to_string(getegid());
    if (errno != EPERM || unshare(kNamespaces | CLONE_NEWUSER) != 0) {
        Fail("this system refuses new namespaces, run as root");
    }
    WriteMap("/proc/self/setgroups", "deny");  // the kernel's condition for mapping the group
    WriteMap("/proc/self/uid_map", "0 " + user + " 1");
    WriteMap("/proc/self/gid_map", "0 " + group + " 1");
    return true;
}

sigset_t HandledSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    for (const int number : {SIGTERM, SIGINT, SIGHUP, SIGCHLD}) {
        sigaddset(&signals, number);
    }
    return signals;
}

pid_t ForkOrFail() {
    const pid_t pid = fork();
    if (pid < 0) {
        Fail("cannot start a process");
    }
    return pid;
}

// Hands signals on to `child`, whose end ends this process with the same status; collects every
// other child. The handled signals must be blocked.
[[noreturn]] void Tend(pid_t child) {
    const sigset_t signals = HandledSignals();
    for (;;) {
        int status = 0;
        pid_t ended = 0;
        while ((ended = waitpid(-1, &status, WNOHANG)) > 0) {
            if (ended == child && WIFSIGNALED(status)) {
                _exit(128 + WTERMSIG(status));
            }
            if (ended == child && WIFEXITED(status)) {
                _exit(WEXITSTATUS(status));
            }
        }
        siginfo_t info{};
        const int number = sigwaitinfo(&signals, &info);
        // What the kernel sent (the terminal's Ctrl-C) went to the whole process group already.
        if (number > 0 && number != SIGCHLD && info.si_code != SI_KERNEL) {
            kill(child, number);
        }
    }
}

// Lets this process die with the one outside, which holds the other end of `outside` open.
void DieWithOutside(int outside) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    pollfd end{outside, POLLIN, 0};
    if (poll(&end, 1, 0) > 0) {  // it died before it could be noticed
        _exit(128 + SIGKILL);
    }
    close(outside);
}

void SetUpOrExit(bool inUserNamespace) {
    try {
        SetUpPrivateSystem(inUserNamespace);
    } catch (const std::exception& error) {
        fprintf(stderr, "%s\n", error.what());
        _exit(kApplianceRootFailed);
    }
}

}  // namespace

void EnterApplianceRoot() {
    const bool inUserNamespace = LeaveNamespaces();
    int life[2];  // holds no data: its writing end is open as long as the process outside lives
    if (pipe(life) != 0) {
        Fail("cannot make a pipe");
    }
    fflush(nullptr);  // or every process would print what is buffered

    signal(SIGCHLD, SIG_DFL);  // ignored by some callers, which would keep the end from us
    const sigset_t signals = HandledSignals();
    sigset_t before;
    sigprocmask(SIG_BLOCK, &signals, &before);
    const pid_t init = ForkOrFail();
    if (init > 0) {
        close(life[0]);
        Tend(init);
    }
    close(life[1]);
    DieWithOutside(life[0]);
    SetUpOrExit(inUserNamespace);
    const pid_t inside = fork();
    if (inside < 0) {
        perror("appliance root: cannot start a process");
        _exit(kApplianceRootFailed);
    }
    if (inside > 0) {
        Tend(inside);
    }
    sigprocmask(SIG_SETMASK, &before, nullptr);
}

}  // namespace taviwireless

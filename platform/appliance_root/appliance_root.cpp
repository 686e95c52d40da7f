// SPDX-License-Identifier: MIT
#include "platform/appliance_root/appliance_root.h"

#include <fcntl.h>
#include <linux/capability.h>
#include <poll.h>
#include <sched.h>
#include <spawn.h>
#include <sys/auxv.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <system_error>
#include <vector>

#include "base/unique_pipe.h"
#include "platform/appliance_root/private_system.h"

namespace taviwireless {
namespace {

namespace fs = std::filesystem;

// What would change the machine itself rather than what is seen inside, such as its clock.
constexpr unsigned long kPowersOverTheMachine[] = {CAP_SYS_MODULE, CAP_SYS_RAWIO, CAP_SYS_BOOT,
                                                   CAP_SYS_TIME,   CAP_MKNOD,     CAP_SYSLOG};

constexpr char kNamespacesRefused[] =
    "new namespaces are refused: run as root, or let ordinary users make user namespaces (sysctl "
    "user.max_user_namespaces, kernel.unprivileged_userns_clone, "
    "kernel.apparmor_restrict_unprivileged_userns); a container has to be a privileged one, and "
    "in a chroot only root can";

[[noreturn]] void Fail(const std::string& sentence) {
    throw std::system_error(errno, std::generic_category(), "appliance root: " + sentence);
}

void WriteMap(const char* path, const std::string& text) {
    std::ofstream file(path);
    if (!(file << text << std::flush)) {
        Fail(std::string("cannot write ") + path);
    }
}

// What has to precede a command that is to be root among all the users that the machine lends to
// the caller: unshare(1) reads /etc/subuid and asks newuidmap(1), which alone may give them away.
constexpr const char* kAmongLentUsers[] = {"unshare", "--user", "--map-root-user", "--map-auto"};

// Puts that before the command, and returns the whole as execvp() takes it, which points into it.
std::vector<char*> AmongLentUsers(std::vector<std::string>& command) {
    command.insert(command.begin(), std::begin(kAmongLentUsers), std::end(kAmongLentUsers));
    std::vector<char*> arguments;
    for (std::string& argument : command) {
        arguments.push_back(argument.data());
    }
    arguments.push_back(nullptr);
    return arguments;
}

bool AreUsersLent() {
    std::vector<std::string> nothing = {"true"};
    const std::vector<char*> arguments = AmongLentUsers(nothing);
    posix_spawn_file_actions_t quiet;
    posix_spawn_file_actions_init(&quiet);
    posix_spawn_file_actions_addopen(&quiet, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
    pid_t child = 0;
    int status = posix_spawnp(&child, arguments[0], &quiet, nullptr, arguments.data(), environ);
    posix_spawn_file_actions_destroy(&quiet);
    return status == 0 && waitpid(child, &status, 0) == child && status == 0;
}

// Starts the program again as root among them. Returns when there are none.
void BecomeRootAmongLentUsers(const fs::path& program) {
    if (!AreUsersLent()) {
        return;
    }
    std::ifstream file("/proc/self/cmdline");
    std::vector<std::string> command;
    for (std::string argument; std::getline(file, argument, '\0');) {
        command.push_back(argument);
    }
    if (command.empty()) {
        return;
    }
    command[0] = program;
    const std::vector<char*> arguments = AmongLentUsers(command);
    execvp(arguments[0], arguments.data());
}

// Makes the namespaces, and a user namespace first when they are refused without.
void LeaveNamespaces(const fs::path& program) {
    constexpr int kNamespaces =
        CLONE_NEWNS | CLONE_NEWNET | CLONE_NEWIPC | CLONE_NEWPID | CLONE_NEWUTS;
    if (unshare(kNamespaces) == 0) {
        return;
    }
    if (errno != EPERM) {
        Fail(kNamespacesRefused);
    }
    BecomeRootAmongLentUsers(program);
    const std::string user = std::to_string(geteuid());
    const std::string group = std::to_string(getegid());
    if (unshare(kNamespaces | CLONE_NEWUSER) != 0) {
        Fail(kNamespacesRefused);
    }
    WriteMap("/proc/self/setgroups", "deny");  // the kernel's condition for mapping the group
    WriteMap("/proc/self/uid_map", "0 " + user + " 1");
    WriteMap("/proc/self/gid_map", "0 " + group + " 1");
}

// Before anything is moved; the program's own path without /proc, which may not be there.
Workplace FindWorkplace(const std::string& output) {
    const auto* program = reinterpret_cast<const char*>(getauxval(AT_EXECFN));
    Workplace workplace = {fs::canonical(program), fs::current_path(), ""};
    if (!output.empty()) {
        std::error_code error;
        workplace.output = fs::canonical(output, error);
        if (error || access(workplace.output.c_str(), W_OK) != 0) {
            errno = error ? error.value() : errno;
            Fail("cannot use the output folder " + output);
        }
    }
    return workplace;
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
void DieWithOutside(const UniqueFd& outside) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    pollfd end{outside.Get(), POLLIN, 0};
    if (poll(&end, 1, 0) > 0) {  // it died before it could be noticed
        _exit(128 + SIGKILL);
    }
}

void SetUpOrExit(const Workplace& workplace) {
    try {
        SetUpPrivateSystem(workplace);
    } catch (const std::exception& error) {
        fprintf(stderr, "%s\n", error.what());
        _exit(kApplianceRootFailed);
    }
    for (const unsigned long power : kPowersOverTheMachine) {
        prctl(PR_CAPBSET_DROP, power);  // of every program that is run from now on
    }
}

}  // namespace

void EnterApplianceRoot(const std::string& output) {
    const Workplace workplace = FindWorkplace(output);
    LeaveNamespaces(workplace.program);
    UniquePipe life;  // holds no data: its writing end is open as long as the process outside lives
    if (!life) {
        Fail("cannot make a pipe");
    }
    fflush(nullptr);  // or every process would print what is buffered

    signal(SIGCHLD, SIG_DFL);  // ignored by some callers, which would keep the end from us
    const sigset_t signals = HandledSignals();
    sigset_t before;
    sigprocmask(SIG_BLOCK, &signals, &before);
    const pid_t init = ForkOrFail();
    if (init > 0) {
        life.readEnd.Close();
        Tend(init);
    }
    life.writeEnd.Close();
    DieWithOutside(life.readEnd);
    life.readEnd.Close();
    SetUpOrExit(workplace);
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

// SPDX-License-Identifier: MIT
#include "cli/interrupt.h"

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <initializer_list>
#include <iostream>
#include <set>
#include <thread>

#include "base/unique_pipe.h"
#include "cli/command_error.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

using Clock = std::chrono::steady_clock;

// Of the signals that end a program, those that are not ignored.
sigset_t EndingSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    for (const int number : {SIGHUP, SIGINT, SIGTERM}) {
        struct sigaction action {};
        sigaction(number, nullptr, &action);
        if (action.sa_handler != SIG_IGN) {
            sigaddset(&signals, number);
        }
    }
    return signals;
}

// The parent of a process; 0 when there is no such process.
pid_t ParentOf(const std::filesystem::path& process) {
    std::ifstream file(process / "stat");
    std::string line;
    std::getline(file, line);
    const size_t name = line.rfind(')');  // the name before it may hold anything
    return name == std::string::npos || name + 4 > line.size() ? 0 : std::atoi(&line.at(name + 4));
}

std::set<pid_t> Children() {
    std::set<pid_t> children;
    std::error_code none;
    for (const auto& entry : std::filesystem::directory_iterator("/proc", none)) {
        const pid_t process = std::atoi(entry.path().filename().c_str());
        if (process > 0 && ParentOf(entry.path()) == getpid()) {
            children.insert(process);
        }
    }
    return children;
}

void Reap() {
    while (waitpid(-1, nullptr, WNOHANG) > 0) {
    }
}

// Ends all that was started, each as it likes if it is quick. What a process that ends has started
// becomes a child of this one, as its reaper.
void EndChildren() {
    constexpr std::chrono::milliseconds kPatience(400);
    constexpr std::chrono::milliseconds kPause(5);
    for (const int number : {SIGTERM, SIGKILL}) {
        std::set<pid_t> told;
        for (const auto end = Clock::now() + kPatience; Clock::now() < end;) {
            Reap();
            const std::set<pid_t> children = Children();
            if (children.empty()) {
                return;
            }
            for (const pid_t child : children) {
                if (told.insert(child).second) {
                    kill(child, number);
                }
            }
            std::this_thread::sleep_for(kPause);
        }
    }
}

[[noreturn]] void DieOf(int number) {
    signal(number, SIG_DFL);
    sigset_t one;
    sigemptyset(&one);
    sigaddset(&one, number);
    sigprocmask(SIG_UNBLOCK, &one, nullptr);
    raise(number);
    _exit(128 + number);
}

// What the program does while its child works.
class Waiting {
  public:
    Waiting(pid_t child, int done, const sigset_t& signals, std::optional<int> seconds)
        : child_(child), done_(done), signals_(signals), seconds_(seconds) {}

    [[noreturn]] void Run(const UndoneBySignal::Undo& undo) {
        const int number = AwaitSignal();
        kill(child_, SIGKILL);
        waitpid(child_, nullptr, 0);
        char byte;
        if (read(done_, &byte, 1) != 1) {
            EndChildren();
            undo(number != kTimeIsOver ? "interrupted"
                                       : "not done within " + std::to_string(*seconds_) + " s");
            std::cout.flush();
        }
        if (number == kTimeIsOver) {
            _exit(kFailure);
        }
        DieOf(number);
    }

  private:
    static constexpr int kTimeIsOver = 0;

    // Returns the signal that this program, or the child, has got. Ends with the child.
    int AwaitSignal() {
        const auto end = Clock::now() + std::chrono::seconds(seconds_.value_or(0));
        for (;;) {
            const int number = NextSignal(end - Clock::now());
            if (number >= 0 && number != SIGCHLD) {
                return number;
            }
            int status = 0;
            for (pid_t ended; (ended = waitpid(-1, &status, WNOHANG)) > 0;) {
                if (ended == child_ && WIFSIGNALED(status)) {
                    return WTERMSIG(status);
                }
                if (ended == child_) {
                    _exit(WEXITSTATUS(status));
                }
            }
        }
    }

    // Negative when there is none yet.
    int NextSignal(Clock::duration left) const {
        if (!seconds_) {
            return sigwaitinfo(&signals_, nullptr);
        }
        using namespace std::chrono;
        const auto rest = std::max(nanoseconds(left), nanoseconds(0));
        const auto whole = duration_cast<seconds>(rest);
        const timespec limit{static_cast<time_t>(whole.count()),
                             static_cast<long>((rest - whole).count())};
        const int number = sigtimedwait(&signals_, nullptr, &limit);
        return number < 0 && errno == EAGAIN ? kTimeIsOver : number;
    }

    const pid_t child_;
    const int done_;
    const sigset_t signals_;
    const std::optional<int> seconds_;
};

}  // namespace

UndoneBySignal::UndoneBySignal(const Undo& undo, std::optional<int> seconds) {
    EndProgress();
    std::cout.flush();
    sigset_t signals = EndingSignals();
    sigset_t before;
    sigaddset(&signals, SIGCHLD);
    sigprocmask(SIG_BLOCK, &signals, &before);
    prctl(PR_SET_CHILD_SUBREAPER, 1);  // of daemons as well
    UniquePipe done;
    const pid_t parent = getpid();
    const pid_t child = done ? fork() : -1;
    if (child > 0) {
        done.writeEnd.Close();
        fcntl(done.readEnd.Get(), F_SETFL, O_NONBLOCK);
        Waiting(child, done.readEnd.Get(), signals, seconds).Run(undo);
    }
    sigprocmask(SIG_SETMASK, &before, nullptr);
    if (child < 0) {
        throw CommandError(kFailure, "there is no process to be had for the work");
    }
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != parent) {
        _exit(kFailure);
    }
    done_ = std::move(done.writeEnd);
}

UndoneBySignal::~UndoneBySignal() {
    const char byte = 1;
    [[maybe_unused]] const ssize_t count = write(done_.Get(), &byte, 1);
}

}  // namespace taviwireless::cli

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_PROCESS_HANDLE_H
#define TAVIWIRELESS_BASE_PROCESS_HANDLE_H

#include <poll.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>

#include "base/kernel_calls.h"
#include "base/unique_fd.h"

namespace taviwireless {

// One process. On Linux 5.3 and newer it means this very process, even when that has ended and its
// number is used again; on older ones whichever has the number.
class ProcessHandle {
  public:
    explicit ProcessHandle(pid_t pid)
        : pid_(pid),
          handle_(pid > 0 ? static_cast<int>(syscall(kPidfdOpen, pid, 0)) : -1),
          isThere_(handle_ || (pid > 0 && kill(pid, 0) == 0)) {}

    // Whether there was such a process; without the handle, one that may be sent signals.
    explicit operator bool() const { return isThere_; }

    // As kill().
    int Signal(int number) const {
        return handle_
                   ? static_cast<int>(syscall(kPidfdSendSignal, handle_.Get(), number, nullptr, 0))
                   : kill(pid_, number);
    }

    // Waits until this child of the caller ends. False when it has not after the limit.
    bool AwaitEnd(std::chrono::milliseconds limit) const {
        if (handle_) {
            pollfd end{handle_.Get(), POLLIN, 0};
            return poll(&end, 1, static_cast<int>(limit.count())) == 1;
        }
        constexpr std::chrono::milliseconds kPause{10};
        for (; !HasEnded(); limit -= kPause) {
            if (limit <= limit.zero()) {
                return false;
            }
            usleep(std::chrono::microseconds(kPause).count());
        }
        return true;
    }

  private:
    bool HasEnded() const {
        siginfo_t child{};
        const int result =
            waitid(P_PID, static_cast<id_t>(pid_), &child, WEXITED | WNOHANG | WNOWAIT);
        return result != 0 || child.si_pid != 0;
    }

    pid_t pid_;
    UniqueFd handle_;
    bool isThere_;
};

}  // namespace taviwireless

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_DIAL_GUARD_H
#define TAVIWIRELESS_CLI_MODEM_DIAL_GUARD_H

#include <chrono>
#include <functional>
#include <mutex>
#include <string>
#include <thread>

#include "base/unique_pipe.h"
#include "cli/options.h"

namespace taviwireless::cli {

// Gives an attempt to connect up when its time is over, or at SIGINT or SIGTERM, wherever the
// program is then: hangs up what was dialled, says so, and ends the program. One at a time.
class DialGuard {
  public:
    // hangUp runs on a thread of its own, and returns soon.
    DialGuard(const Options& options, int seconds, std::function<void()> hangUp);
    ~DialGuard();
    DialGuard(const DialGuard&) = delete;
    DialGuard& operator=(const DialGuard&) = delete;

    // From now on there is something to hang up.
    void HasDialled();

  private:
    void Watch();
    [[noreturn]] void GiveUp(int signal);

    const Options& options_;
    const int seconds_;
    const std::chrono::steady_clock::time_point end_;
    std::function<void()> hangUp_;
    std::mutex mutex_;  // held while it gives up
    bool hasDialled_ = false;
    UniquePipe told_;  // the number of a signal, or 0 to end
    std::thread watcher_;
};

}  // namespace taviwireless::cli

#endif

// SPDX-License-Identifier: MIT
#include "cli/modem/dial_guard.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <iostream>
#include <utility>

#include "cli/command_error.h"
#include "cli/report.h"

namespace taviwireless::cli {

namespace {

constexpr int kSignals[] = {SIGINT, SIGTERM};

std::atomic<int> toldHandle{-1};

void Tell(int signal) {
    const int savedErrno = errno;
    const auto number = static_cast<char>(signal);
    if (write(toldHandle, &number, 1) < 0) {
        // the pipe holds others already
    }
    errno = savedErrno;
}

void SetHandlers(void (*handler)(int)) {
    for (const int number : kSignals) {
        struct sigaction action {};
        action.sa_handler = handler;
        action.sa_flags = SA_RESTART;
        sigaction(number, &action, nullptr);
    }
}

}  // namespace

DialGuard::DialGuard(const Options& options, int seconds, std::function<void()> hangUp)
    : options_(options),
      seconds_(options.timeout.value_or(seconds)),
      end_(std::chrono::steady_clock::now() + std::chrono::seconds(seconds_)),
      hangUp_(std::move(hangUp)) {
    if (!told_) {
        throw CommandError(kFailure, "there are no file descriptors left");
    }
    toldHandle = told_.writeEnd.Get();
    SetHandlers(Tell);
    watcher_ = std::thread([this] { Watch(); });
}

DialGuard::~DialGuard() {
    SetHandlers(SIG_DFL);
    Tell(0);
    watcher_.join();
}

void DialGuard::HasDialled() {
    const std::lock_guard lock(mutex_);
    hasDialled_ = true;
}

void DialGuard::Watch() {
    using std::chrono::milliseconds;
    for (;;) {
        const auto left =
            std::chrono::ceil<milliseconds>(end_ - std::chrono::steady_clock::now()).count();
        pollfd waiting{told_.readEnd.Get(), POLLIN, 0};
        if (left <= 0) {
            GiveUp(0);
        }
        if (poll(&waiting, 1, static_cast<int>(left)) == 1) {
            char number = 0;
            if (read(waiting.fd, &number, 1) == 1 && number != 0) {
                GiveUp(number);
            }
            return;
        }
    }
}

void DialGuard::GiveUp(int signal) {
    const std::lock_guard lock(mutex_);
    SetHandlers(SIG_DFL);  // whoever is in a hurry asks again
    if (hasDialled_) {
        hangUp_();
    }
    const std::string after = std::to_string(seconds_) + " s";
    const std::string reason =
        signal != 0 ? "interrupted"
                    : (hasDialled_ ? "not connected after " : "not done within ") + after;
    PrintFailure(options_,
                 options_.id + ": " + reason +
                     (hasDialled_ ? "; the dialling is given up" : "; nothing was dialled"));
    std::cout.flush();
    _exit(signal != 0 ? 128 + signal : static_cast<int>(kFailure));
}

}  // namespace taviwireless::cli

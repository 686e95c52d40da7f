// SPDX-License-Identifier: MIT
#include "cli/deadline.h"

#include <unistd.h>

#include <iostream>
#include <utility>

#include "cli/command_error.h"
#include "cli/report.h"
#include "cli/signal_free_thread.h"

namespace taviwireless::cli {

namespace {

Deadline* innermost = nullptr;

}  // namespace

Deadline::Deadline(const Options& options, std::optional<int> seconds)
    : seconds_(options.timeout ? options.timeout : seconds), options_(options) {
    if (seconds_) {
        sentence_ = "not done within " + std::to_string(*seconds_) +
                    " s; what was begun may still come to its end";
        Restart();
        watcher_ = StartBeside([this] { Watch(); });
    }
    outer_ = std::exchange(innermost, this);
    wasRunning_ = outer_ != nullptr && outer_->Stop();
}

Deadline::~Deadline() {
    if (watcher_.joinable()) {
        {
            const std::lock_guard lock(mutex_);
            isOver_ = true;
        }
        changed_.notify_one();
        watcher_.join();
    }
    innermost = outer_;
    if (wasRunning_) {
        outer_->Start();
    }
}

void Deadline::Restart() {
    const std::lock_guard lock(mutex_);
    left_ = std::chrono::seconds(seconds_.value_or(0));
}

void Deadline::SetSentence(const std::string& sentence) {
    const std::lock_guard lock(mutex_);
    sentence_ = sentence;
}

void Deadline::Start() {
    const std::lock_guard lock(mutex_);
    end_ = Clock::now() + left_;
    changed_.notify_one();
}

bool Deadline::Stop() {
    const std::lock_guard lock(mutex_);
    if (!end_) {
        return false;
    }
    left_ = *end_ - Clock::now();
    end_.reset();
    changed_.notify_one();
    return true;
}

void Deadline::Watch() {
    std::unique_lock lock(mutex_);
    while (!isOver_) {
        if (!end_) {
            changed_.wait(lock);
        } else if (Clock::now() < *end_) {
            changed_.wait_until(lock, *end_);
        } else {
            // The lock stays held: the work cannot end, and report, at the same time.
            PrintFailure(options_, sentence_);
            std::cout.flush();
            _exit(kFailure);
        }
    }
}

Untimed::Untimed() : paused_(innermost != nullptr && innermost->Stop() ? innermost : nullptr) {}

Untimed::~Untimed() {
    if (paused_ != nullptr) {
        paused_->Start();
    }
}

}  // namespace taviwireless::cli

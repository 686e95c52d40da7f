// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_DEADLINE_H
#define TAVIWIRELESS_CLI_DEADLINE_H

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

#include "cli/options.h"

namespace taviwireless::cli {

// The time that a command may take. A call of the library cannot be ended early, so when the time
// is over while work is done, the failure is printed and the program ends there and then.
//
// Every command has one, by --timeout. A command that wants another makes its own, for the time
// between whose pieces of work no limit counts.
class Deadline {
  public:
    // What Options::timeout says, or these seconds; without both there is no limit.
    explicit Deadline(const Options& options, std::optional<int> seconds = std::nullopt);
    ~Deadline();
    Deadline(const Deadline&) = delete;
    Deadline& operator=(const Deadline&) = delete;

    template <typename Work>
    auto Limit(const Work& work) {
        const Running running(*this);
        return work();
    }

    // The whole time again, for a command that goes on for ever.
    void Restart();

    // What is printed when the time is over.
    void SetSentence(const std::string& sentence);

    int Seconds() const { return seconds_.value_or(0); }

  private:
    using Clock = std::chrono::steady_clock;

    class Running {
      public:
        explicit Running(Deadline& deadline) : deadline_(deadline) { deadline_.Start(); }
        ~Running() { deadline_.Stop(); }
        Running(const Running&) = delete;
        Running& operator=(const Running&) = delete;

      private:
        Deadline& deadline_;
    };

    void Start();
    bool Stop();  // returns whether the time counted
    void Watch();

    const std::optional<int> seconds_;
    const Options& options_;
    std::mutex mutex_;  // guards what follows
    std::condition_variable changed_;
    std::string sentence_;
    Clock::duration left_{};
    std::optional<Clock::time_point> end_;  // while work is done
    bool isOver_ = false;
    std::thread watcher_;

    friend class Untimed;
    Deadline* outer_ = nullptr;  // whose time does not count while this one lives
    bool wasRunning_ = false;
};

// While it lives, no time counts: input is read from a person.
class Untimed {
  public:
    Untimed();
    ~Untimed();
    Untimed(const Untimed&) = delete;
    Untimed& operator=(const Untimed&) = delete;

  private:
    Deadline* const paused_;
};

}  // namespace taviwireless::cli

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_PROCESS_H
#define TAVIWIRELESS_TESTS_SUPPORT_PROCESS_H

#include <sys/types.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "base/unique_fd.h"

namespace taviwireless::test {

// The path of a program of this project, built into the same directory as the running test.
std::string BuiltProgram(const std::string& name);

// The command, started with waits cut that nothing depends on: see short_waits.cpp.
std::vector<std::string> WithShortWaits(std::vector<std::string> argv);

// A program that runs beside the test, with its standard input and output connected to it; its
// standard error is the test's own. The destructor kills it and waits for it.
class Process {
  public:
    using Milliseconds = std::chrono::milliseconds;
    static constexpr Milliseconds kPatience{50000};  // as busy as a machine may be

    // Starts argv[0], found along PATH when it holds no slash. Throws std::system_error when it
    // cannot be run.
    explicit Process(const std::vector<std::string>& argv);
    ~Process();
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    pid_t Pid() const { return pid_; }

    // The next line of its output without the line's end. Nothing when the time is over, or at the
    // end of the output once its last line (ended or not) was returned; AtEnd() tells which.
    std::optional<std::string> ReadLine(Milliseconds patience = kPatience);
    bool AtEnd() const { return atEnd_ && unread_.empty(); }

    // Writes `line` and a line's end to its input. False when it no longer reads.
    bool WriteLine(const std::string& line);
    void CloseInput() { input_.Close(); }

    void Signal(int number);

    // Waits for its end. The exit status, 128 + N when signal N killed it, nothing when the time is
    // over. May be called again.
    std::optional<int> Wait(Milliseconds patience = kPatience);

  private:
    pid_t pid_ = -1;
    UniqueFd input_;
    UniqueFd output_;
    std::string unread_;
    bool atEnd_ = false;
    std::optional<int> status_;
};

struct RunResult {
    int status;  // exit status, or 128 + N when signal N killed it
    std::string out;
    std::string err;
};

// Runs a program to its end with `input` on its standard input. One that has not ended within 50 s
// is killed, and std::runtime_error thrown.
RunResult RunProgram(const std::vector<std::string>& argv, const std::string& input = "");

// Runs a shell script, whose failure is one of the case, and returns what it printed.
std::string Shell(const std::string& script);

// RunProgram as a user who is not root, wherever the program lies.
RunResult RunAsNobody(std::vector<std::string> argv);

}  // namespace taviwireless::test

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_TERMINAL_H
#define TAVIWIRELESS_TESTS_SUPPORT_TERMINAL_H

#include <sys/types.h>

#include <string>
#include <vector>

#include "base/unique_fd.h"

namespace taviwireless::test {

// A program in a pseudo-terminal of its own. The destructor kills it and waits for it.
class Terminal {
  public:
    Terminal(const std::vector<std::string>& argv, unsigned short columns);
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    void Type(const std::string& text) const;
    void Signal(int number) const;

    // Whether what is typed appears.
    bool Echoes() const;

    // Reads until the text was shown, behind that which was awaited before. False when it was not by
    // the end of the program, or within 50 s.
    bool Await(const std::string& text);

    // Await; then the program sleeps, so that a signal interrupts its reading.
    bool AwaitPrompt(const std::string& text);

    // Waits until the program has ended. Its exit status, or 128 + N when signal N killed it.
    int Wait();
    // All that was shown until now.
    const std::string& Shown() const { return shown_; }

  private:
    bool Read();
    bool HasEnded();

    UniqueFd master_;
    UniqueFd slave_;  // so that the terminal outlives the program
    pid_t pid_ = -1;
    int status_ = -1;
    std::string shown_;
    size_t awaited_ = 0;
};

}  // namespace taviwireless::test

#endif

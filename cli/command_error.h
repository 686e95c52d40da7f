// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_COMMAND_ERROR_H
#define TAVIWIRELESS_CLI_COMMAND_ERROR_H

#include <stdexcept>
#include <string>

namespace taviwireless::cli {

// What the program ends with.
enum ExitStatus {
    kSuccess = 0,
    kFailure = 1,
    kUsage = 2,
    kNotFound = 3,
    kBusy = 4,
    kNoService = 5
};

// A failure to report: one plain sentence, and what the program ends with.
class CommandError : public std::runtime_error {
  public:
    CommandError(ExitStatus status, const std::string& sentence)
        : std::runtime_error(sentence), status_(status) {}
    ExitStatus Status() const { return status_; }

  private:
    ExitStatus status_;
};

}  // namespace taviwireless::cli

#endif

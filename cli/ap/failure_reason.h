// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_FAILURE_REASON_H
#define TAVIWIRELESS_CLI_AP_FAILURE_REASON_H

#include <string>

#include "base/unique_fd.h"

namespace taviwireless::cli {

// Keeps what this process, and the programs that it runs, write on standard error while it lives.
// Its end prints that.
class ErrorKeeper {
  public:
    ErrorKeeper();
    ~ErrorKeeper();
    ErrorKeeper(const ErrorKeeper&) = delete;
    ErrorKeeper& operator=(const ErrorKeeper&) = delete;

    std::string Text() const;

  private:
    UniqueFd kept_;
    UniqueFd before_;
};

// Why the network program failed, in one sentence of what it wrote on standard error, with hostapd's
// own reason where it was that; empty when it wrote nothing.
std::string ReasonIn(const std::string& errors);

}  // namespace taviwireless::cli

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_DIAL_FAILURE_H
#define TAVIWIRELESS_CLI_MODEM_DIAL_FAILURE_H

#include <sys/stat.h>

#include <optional>
#include <string>

#include "cli/modem/modem_access.h"

namespace taviwireless::cli {

// One attempt to connect, and why it failed.
class DialAttempt {
  public:
    // To be made before the modem is told to dial.
    DialAttempt(ModemAccess& access, const ModemState& state);

    // The failure as a sentence, by the dialler's log, or by what kept the dialler from being
    // started.
    CommandError Failure() const;

  private:
    std::string id_;
    std::string log_;  // empty while the SIM is not known
    std::optional<struct stat> before_;
    bool takesDefaultRoute_;
};

}  // namespace taviwireless::cli

#endif

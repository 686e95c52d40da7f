// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_PORT_TROUBLE_H
#define TAVIWIRELESS_CLI_MODEM_PORT_TROUBLE_H

#include <optional>
#include <string>

#include "cli/command_error.h"

namespace taviwireless::cli {

// Why this user cannot use any port of a modem that is plugged in: they are not there, or not for
// him; nothing when he can.
std::optional<CommandError> PortTrouble(const std::string& id);

// Why this user cannot use the folder in which profiles and diallers are kept; empty when he can.
std::string StateFolderTrouble();

// Why the ports of a modem cannot be opened beside another program: the modem service, or whatever
// has locked the ports on which questions are asked. Nothing when they are free.
struct PortHolder {
    bool isService = false;
    std::string sentence;
};
std::optional<PortHolder> HolderOfPorts(const std::string& id);

}  // namespace taviwireless::cli

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_SESSION_BUS_H
#define TAVIWIRELESS_CLI_MODEM_SESSION_BUS_H

#include <string>

namespace taviwireless::cli {

// Whether this process is told of a session bus, or finds that of its user at the usual place and
// tells itself.
bool FindSessionBus();

// Whether the modem service is on the session bus.
bool IsServiceThere();

// Sends the service the call that ends a connection, and waits for nothing.
void HangUpByBus(const std::string& id);

// Makes sure that there is a session bus and that the modem service is on it, which the bus is told
// to start where it knows how. Returns whether it was started now. Throws CommandError.
bool RequireService();

}  // namespace taviwireless::cli

#endif

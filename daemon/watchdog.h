// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_WATCHDOG_H
#define TAVIWIRELESS_DAEMON_WATCHDOG_H

namespace taviwireless::daemon {

// From now on tells the service manager that the main loop turns, twice in the time that its
// watchdog waits; nothing when there is no watchdog. So a service that hangs is started anew.
void FeedWatchdog();

}  // namespace taviwireless::daemon

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_SEMAPHORE_SETS_H
#define TAVIWIRELESS_DAEMON_SEMAPHORE_SETS_H

#include <sys/types.h>

namespace taviwireless::daemon {

// Removes the private semaphore sets that this process used last. The lock of usbmodem0 has the
// private key, with which every use makes a new set that nobody ever finds again: two for each
// command, until the system's limit (kernel.sem) leaves none for anybody. To be called while no
// command is under way.
void RemovePrivateSemaphoreSets(pid_t process);

}  // namespace taviwireless::daemon

#endif

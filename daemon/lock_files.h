// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_LOCK_FILES_H
#define TAVIWIRELESS_DAEMON_LOCK_FILES_H

#include <sys/types.h>

namespace taviwireless::daemon {

// Removes the lock files of serial ports ("/var/lock/LCK..ttyUSB" and a number) that this process,
// which has ended, left behind.
void RemovePortLocks(pid_t process);

}  // namespace taviwireless::daemon

#endif

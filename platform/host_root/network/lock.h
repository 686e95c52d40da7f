// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_LOCK_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_LOCK_H

#include "base/unique_fd.h"

namespace taviwireless::network {

// One restart at a time. The lock is on a file that others cannot open, so nobody else can take it.
// Throws Error, which names the holder, when it is not free after a minute. The programs that are
// started do not inherit it.
UniqueFd TakeLock();

}  // namespace taviwireless::network

#endif

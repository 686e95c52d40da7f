// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_CLOSE_ALL_FROM_H
#define TAVIWIRELESS_BASE_CLOSE_ALL_FROM_H

#include <unistd.h>

#include "base/kernel_calls.h"

namespace taviwireless {

// Closes all descriptors from first on. For a process that was forked off another one: so it
// allocates nothing.
inline void CloseAllFrom(int first) {
    if (syscall(kCloseRange, first, ~0U, 0) == 0) {
        return;
    }
    const long end = sysconf(_SC_OPEN_MAX);
    for (int descriptor = first; descriptor < end; ++descriptor) {
        close(descriptor);
    }
}

}  // namespace taviwireless

#endif

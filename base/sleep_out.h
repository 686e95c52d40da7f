// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_SLEEP_OUT_H
#define TAVIWIRELESS_BASE_SLEEP_OUT_H

#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <thread>

namespace taviwireless {

// Sleeps, through signals that are caught. Returns whether there were any.
inline bool SleepOut(unsigned int seconds) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(seconds);
    bool isCut = false;
    bool wasInterrupted = false;
    for (unsigned int left = seconds; left > 0;) {
        errno = 0;
        left = sleep(left);
        isCut = isCut || errno == EINTR;
        wasInterrupted = wasInterrupted || isCut || left > 0;
    }
    if (isCut) {
        std::this_thread::sleep_until(end);  // sleep() does not count parts of a second
    }
    return wasInterrupted;
}

}  // namespace taviwireless

#endif

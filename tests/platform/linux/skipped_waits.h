// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_PLATFORM_LINUX_SKIPPED_WAITS_H
#define TAVIWIRELESS_TESTS_PLATFORM_LINUX_SKIPPED_WAITS_H

#include <functional>

// The C library's usleep(), steady clock and fsync(), which a test program with this file takes
// over, for the libraries it loads as well.
namespace taviwireless::test {

// While it lives, usleep() returns at once and the steady clock goes on by what was asked for: a
// wait with a limit ends at that limit and takes no time. At most one may live at a time.
class SkippedWaits {
  public:
    SkippedWaits();
    ~SkippedWaits();
    SkippedWaits(const SkippedWaits&) = delete;
    SkippedWaits& operator=(const SkippedWaits&) = delete;

    double Seconds() const;  // that were skipped
};

// Called instead of each fsync() in this process: the place to stop a writer in the middle.
void AtEachSync(std::function<void()> hook);

}  // namespace taviwireless::test

#endif

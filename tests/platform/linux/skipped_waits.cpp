// SPDX-License-Identifier: MIT
#include "tests/platform/linux/skipped_waits.h"

#include <sys/syscall.h>
#include <time.h>
#include <unistd.h>

#include <atomic>
#include <utility>

namespace taviwireless::test {
namespace {

constexpr long long kNanosecondsPerSecond = 1'000'000'000;

std::atomic<bool> isSkipping{false};
std::atomic<long long> skipped{0};  // ns; stays when the capture ends: the clock never goes back
std::atomic<long long> skippedBefore{0};
std::function<void()> atEachSync;

}  // namespace

SkippedWaits::SkippedWaits() {
    skippedBefore = skipped.load();
    isSkipping = true;
}

SkippedWaits::~SkippedWaits() {
    isSkipping = false;
}

double SkippedWaits::Seconds() const {
    return static_cast<double>(skipped - skippedBefore) / kNanosecondsPerSecond;
}

void AtEachSync(std::function<void()> hook) {
    atEachSync = std::move(hook);
}

}  // namespace taviwireless::test

using namespace taviwireless::test;

#define TAKEN_OVER extern "C" __attribute__((visibility("default")))

TAKEN_OVER int usleep(useconds_t microseconds) {
    const long long nanoseconds = 1000LL * microseconds;
    if (isSkipping) {
        skipped += nanoseconds;
        return 0;
    }
    const timespec time{static_cast<time_t>(nanoseconds / kNanosecondsPerSecond),
                        static_cast<long>(nanoseconds % kNanosecondsPerSecond)};
    return nanosleep(&time, nullptr);
}

TAKEN_OVER int clock_gettime(clockid_t clock, timespec* now) noexcept {
    const int result = static_cast<int>(syscall(SYS_clock_gettime, clock, now));
    if (result == 0 && clock == CLOCK_MONOTONIC) {
        const long long nanoseconds = now->tv_nsec + skipped % kNanosecondsPerSecond;
        now->tv_sec += skipped / kNanosecondsPerSecond + nanoseconds / kNanosecondsPerSecond;
        now->tv_nsec = nanoseconds % kNanosecondsPerSecond;
    }
    return result;
}

TAKEN_OVER int fsync(int descriptor) {
    if (atEachSync) {
        atEachSync();
        return 0;
    }
    return static_cast<int>(syscall(SYS_fsync, descriptor));
}

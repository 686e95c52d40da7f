// SPDX-License-Identifier: MIT
#include "tests/support/sleep_capture.h"

#include <dlfcn.h>
#include <poll.h>

#include <utility>

namespace taviwireless::test {
namespace {

SleepCapture* capture = nullptr;

}  // namespace

SleepCapture::SleepCapture(Hook atEachSleep) : atEachSleep_(std::move(atEachSleep)) {
    capture = this;
}

SleepCapture::~SleepCapture() {
    capture = nullptr;
}

unsigned SleepCapture::Record(unsigned seconds) {
    calls_.push_back(seconds);
    if (atEachSleep_) {
        atEachSleep_(seconds);
    }
    return std::exchange(leftByNext_, 0);
}

}  // namespace taviwireless::test

extern "C" __attribute__((visibility("default"))) unsigned sleep(unsigned seconds) {
    return taviwireless::test::capture != nullptr ? taviwireless::test::capture->Record(seconds)
                                                  : 0;
}

// Weak, because a program may have one of its own.
extern "C" __attribute__((visibility("default"), weak)) int ppoll(pollfd* events, nfds_t count,
                                                                  const timespec* limit,
                                                                  const sigset_t* mask) {
    static const auto next = reinterpret_cast<decltype(&ppoll)>(dlsym(RTLD_NEXT, "ppoll"));
    constexpr timespec kLongest{0, 50000000};
    const bool isLong =
        limit != nullptr && (limit->tv_sec > 0 || limit->tv_nsec > kLongest.tv_nsec);
    return next(events, count, isLong ? &kLongest : limit, mask);
}

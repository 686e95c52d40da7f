// SPDX-License-Identifier: MIT
#include "tests/support/sleep_capture.h"

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

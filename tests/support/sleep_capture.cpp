#include "tests/support/sleep_capture.h"

#include <cstdlib>
#include <mutex>
#include <numeric>
#include <utility>

namespace taviwireless::test {
namespace {

struct Record {
    std::mutex mutex;
    bool alive = false;
    std::vector<unsigned> calls;
    SleepCapture::Hook atEachSleep;
    unsigned leftByNext = 0;  // seconds
};

Record record;

// Returns what the sleep returns.
unsigned RecordSleep(unsigned seconds) {
    SleepCapture::Hook hook;
    unsigned left = 0;
    {
        const std::lock_guard<std::mutex> lock(record.mutex);
        if (record.alive) {
            record.calls.push_back(seconds);
            hook = record.atEachSleep;
            left = std::exchange(record.leftByNext, 0);
        }
    }
    if (hook) {  // without the lock: it may ask for Calls()
        hook(seconds);
    }
    return left;
}

}  // namespace

SleepCapture::SleepCapture(Hook atEachSleep) {
    const std::lock_guard<std::mutex> lock(record.mutex);
    if (record.alive) {
        abort();
    }
    record.alive = true;
    record.calls.clear();
    record.leftByNext = 0;
    record.atEachSleep = std::move(atEachSleep);
}

SleepCapture::~SleepCapture() {
    const std::lock_guard<std::mutex> lock(record.mutex);
    record.alive = false;
    record.atEachSleep = nullptr;
}

void SleepCapture::InterruptNext(unsigned secondsLeft) {
    const std::lock_guard<std::mutex> lock(record.mutex);
    record.leftByNext = secondsLeft;
}

std::vector<unsigned> SleepCapture::Calls() const {
    const std::lock_guard<std::mutex> lock(record.mutex);
    return record.calls;
}

unsigned SleepCapture::Total() const {
    const auto calls = Calls();
    return std::accumulate(calls.begin(), calls.end(), 0u);
}

}  // namespace taviwireless::test

extern "C" __attribute__((visibility("default"))) unsigned sleep(unsigned seconds) {
    return taviwireless::test::RecordSleep(seconds);
}

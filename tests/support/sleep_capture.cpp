#include "tests/support/sleep_capture.h"

#include <cstdlib>
#include <mutex>
#include <numeric>

namespace taviwireless::test {
namespace {

struct Record {
    std::mutex mutex;
    bool alive = false;
    std::vector<unsigned> calls;
    SleepCapture::Hook atEachSleep;
};

Record record;

void RecordSleep(unsigned seconds) {
    SleepCapture::Hook hook;
    {
        const std::lock_guard<std::mutex> lock(record.mutex);
        if (record.alive) {
            record.calls.push_back(seconds);
            hook = record.atEachSleep;
        }
    }
    if (hook) {  // without the lock: it may ask for Calls()
        hook(seconds);
    }
}

}  // namespace

SleepCapture::SleepCapture(Hook atEachSleep) {
    const std::lock_guard<std::mutex> lock(record.mutex);
    if (record.alive) {
        abort();
    }
    record.alive = true;
    record.calls.clear();
    record.atEachSleep = std::move(atEachSleep);
}

SleepCapture::~SleepCapture() {
    const std::lock_guard<std::mutex> lock(record.mutex);
    record.alive = false;
    record.atEachSleep = nullptr;
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
    taviwireless::test::RecordSleep(seconds);
    return 0;
}

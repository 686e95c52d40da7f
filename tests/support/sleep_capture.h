// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_SLEEP_CAPTURE_H
#define TAVIWIRELESS_TESTS_SUPPORT_SLEEP_CAPTURE_H

#include <functional>
#include <vector>

namespace taviwireless::test {

// Records the calls of sleep() while it lives; at most one may live at a time.
//
// A program linked with tavi_test_support defines sleep() itself, for the shared libraries it loads
// as well: it returns 0 at once, with or without a SleepCapture, unless told otherwise. ppoll()
// waits 50 ms at most. usleep(), nanosleep() and waiting in poll() or select() stay as they are.
class SleepCapture {
  public:
    // Called with the seconds at each sleep, after it was recorded and in the thread that sleeps:
    // the place to change the world while the code under test "waits".
    using Hook = std::function<void(unsigned seconds)>;

    explicit SleepCapture(Hook atEachSleep = {});
    ~SleepCapture();
    SleepCapture(const SleepCapture&) = delete;
    SleepCapture& operator=(const SleepCapture&) = delete;

    // The next sleep returns this, as one that a signal ends so many seconds early.
    void InterruptNext(unsigned secondsLeft) { leftByNext_ = secondsLeft; }

    const std::vector<unsigned>& Calls() const { return calls_; }  // the seconds of each, in order

    unsigned Record(unsigned seconds);  // what sleep() does

  private:
    Hook atEachSleep_;
    std::vector<unsigned> calls_;
    unsigned leftByNext_ = 0;
};

}  // namespace taviwireless::test

#endif

// SPDX-License-Identifier: MIT
// A library that shortens waits, for a program linked with it or started with it in LD_PRELOAD. It
// takes the place of sleep() and g_timeout_add_seconds(), whose seconds last 50 ms, and of
// select(): the waits for silence, before an AT command and behind its reply, are cut to 5 ms, and
// the clock by which they are told to be over is put forward by the rest. What is checked stays as
// it was: the simulated modem sends a reply in one piece, so no wait decides where a reply ends,
// and the wait for its beginning (1 s) is not cut. While TAVI_QUIET_WAITS is set, the waits for
// silence are whole. The wait for a lock is over after a second (with
// TAVI_LOCK_IS_KEPT after 50 ms), and the clock put forward, too.
#include <dlfcn.h>
#include <sys/select.h>
#include <sys/sem.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <ctime>

#define TAKEN_OVER extern "C" __attribute__((visibility("default")))

namespace {

constexpr suseconds_t kLongestQuietWait = 200000;  // µs
constexpr suseconds_t kShortWait = 5000;           // µs
constexpr unsigned kShortSecond = 50;              // ms

std::atomic<long long> notWaited{0};  // µs

template <typename Function>
Function* Next(const char* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace

TAKEN_OVER int select(int count, fd_set* readable, fd_set* writable, fd_set* exceptional,
                      timeval* timeout) {
    static const auto next = Next<decltype(select)>("select");
    timeval shortened{0, kShortWait};
    const bool isQuietWait =
        timeout != nullptr && timeout->tv_sec == 0 && timeout->tv_usec > kShortWait &&
        timeout->tv_usec <= kLongestQuietWait && getenv("TAVI_QUIET_WAITS") == nullptr;
    if (!isQuietWait) {
        return next(count, readable, writable, exceptional, timeout);
    }
    const int result = next(count, readable, writable, exceptional, &shortened);
    if (result == 0) {
        notWaited += timeout->tv_usec - kShortWait;
    }
    return result;
}

TAKEN_OVER int semtimedop(int semid, sembuf* operations, size_t count, const timespec* limit) {
    static const auto next = Next<decltype(semtimedop)>("semtimedop");
    // Far above what an exchange takes, unless nobody has the lock but who keeps it.
    const timespec kLongest =
        getenv("TAVI_LOCK_IS_KEPT") == nullptr ? timespec{1, 0} : timespec{0, 50000000};
    if (limit->tv_sec <= kLongest.tv_sec) {
        return next(semid, operations, count, limit);
    }
    const int result = next(semid, operations, count, &kLongest);
    if (result != 0 && errno == EAGAIN) {
        notWaited += (limit->tv_sec - kLongest.tv_sec) * 1000000LL +
                     (limit->tv_nsec - kLongest.tv_nsec) / 1000;
    }
    return result;
}

TAKEN_OVER int clock_gettime(clockid_t clock, timespec* time) {
    static const auto next = Next<decltype(clock_gettime)>("clock_gettime");
    const int result = next(clock, time);
    if (result == 0 && clock == CLOCK_MONOTONIC) {
        constexpr long kSecond = 1000000000;  // ns
        const long long skew = notWaited * 1000 + time->tv_nsec;
        time->tv_sec += static_cast<time_t>(skew / kSecond);
        time->tv_nsec = static_cast<long>(skew % kSecond);
    }
    return result;
}

TAKEN_OVER unsigned sleep(unsigned seconds) {
    usleep(seconds * kShortSecond * 1000);
    return 0;
}

TAKEN_OVER unsigned g_timeout_add_seconds(unsigned seconds, int (*function)(void*), void* data) {
    static const auto add = Next<unsigned(unsigned, int (*)(void*), void*)>("g_timeout_add");
    return add(seconds * kShortSecond, function, data);
}

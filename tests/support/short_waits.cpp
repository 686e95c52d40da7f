// A library that takes the place of the C library's select(), for a program linked with it or
// started with it in LD_PRELOAD: the waits for silence, before an AT command and behind its reply,
// are cut to 10 ms, and the clock by which they are told to be over is put forward by the rest.
// What is checked stays as it was: the simulated modem sends a reply in one piece, so no wait
// decides where a reply ends, and the wait for its beginning (1 s) is not cut.
#include <dlfcn.h>
#include <sys/select.h>

#include <atomic>
#include <ctime>

#define TAKEN_OVER extern "C" __attribute__((visibility("default")))

namespace {

constexpr suseconds_t kLongestQuietWait = 200000;  // µs
constexpr suseconds_t kShortWait = 10000;          // µs

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
    const bool isQuietWait = timeout != nullptr && timeout->tv_sec == 0 &&
                             timeout->tv_usec > kShortWait && timeout->tv_usec <= kLongestQuietWait;
    if (!isQuietWait) {
        return next(count, readable, writable, exceptional, timeout);
    }
    const int result = next(count, readable, writable, exceptional, &shortened);
    if (result == 0) {
        notWaited += timeout->tv_usec - kShortWait;
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

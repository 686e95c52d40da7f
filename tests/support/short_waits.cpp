// A library that takes the place of the C library's select(), for a program linked with it or
// started with it in LD_PRELOAD: the waits for silence, before an AT command and behind its reply,
// are cut to 10 ms. What is checked stays as it was: the simulated modem sends a reply in one
// piece, so no wait decides where a reply ends, and the wait for its beginning (1 s) is not cut.
#include <dlfcn.h>
#include <sys/select.h>

namespace {

constexpr suseconds_t kLongestQuietWait = 200000;  // µs
constexpr suseconds_t kShortWait = 10000;          // µs

}  // namespace

extern "C" __attribute__((visibility("default"))) int select(int count, fd_set* readable,
                                                             fd_set* writable, fd_set* exceptional,
                                                             timeval* timeout) {
    static const auto next = reinterpret_cast<decltype(&select)>(dlsym(RTLD_NEXT, "select"));
    timeval shortened{0, kShortWait};
    const bool isQuietWait = timeout != nullptr && timeout->tv_sec == 0 &&
                             timeout->tv_usec > kShortWait && timeout->tv_usec <= kLongestQuietWait;
    return next(count, readable, writable, exceptional, isQuietWait ? &shortened : timeout);
}

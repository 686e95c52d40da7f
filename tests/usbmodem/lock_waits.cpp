#include "tests/usbmodem/lock_waits.h"

#include <dlfcn.h>
#include <sys/sem.h>

#include <algorithm>
#include <ctime>

namespace taviwireless::test {

bool lockWaitsAreCut = false;
std::chrono::seconds longestCutWait{0};

}  // namespace taviwireless::test

// In place of the C library's.
extern "C" __attribute__((visibility("default"))) int semtimedop(int semid, sembuf* operations,
                                                                 size_t count,
                                                                 const timespec* limit) {
    using namespace taviwireless::test;
    static const auto next =
        reinterpret_cast<decltype(&semtimedop)>(dlsym(RTLD_NEXT, "semtimedop"));
    if (!lockWaitsAreCut) {
        return next(semid, operations, count, limit);
    }
    longestCutWait = std::max(longestCutWait, std::chrono::seconds(limit->tv_sec));
    const timespec none{};
    return next(semid, operations, count, &none);
}

#include "tests/wireless/failing_stat.h"

#include <dlfcn.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

namespace taviwireless::test {

int gFailingStat = getenv("FAILING_STAT") == nullptr ? 0 : atoi(getenv("FAILING_STAT"));

}  // namespace taviwireless::test

extern "C" __attribute__((visibility("default"))) int stat(const char* path,
                                                           struct stat* status) noexcept {
    if (strcmp(path, "/usr/tavi/etc/wireless_ap.conf") == 0 &&
        --taviwireless::test::gFailingStat == 0) {
        errno = EIO;
        return -1;
    }
    static const auto next =
        reinterpret_cast<int (*)(const char*, struct stat*)>(dlsym(RTLD_NEXT, "stat"));
    return next(path, status);
}

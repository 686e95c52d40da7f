#ifndef TAVIWIRELESS_WIRELESS_PRESENCE_H
#define TAVIWIRELESS_WIRELESS_PRESENCE_H

#include <sys/stat.h>
#include <tavicore/file.h>

#include <cerrno>

namespace taviwireless::wireless {

enum class Presence { kThere, kMissing, kUnknown };

// Whether there is such a file. Missing is only what the system calls missing: a store of settings
// that cannot be looked at may hold what protects a network.
inline Presence Look(const char* path) {
    if (VEXACFileExist(path)) {
        return Presence::kThere;
    }
    struct stat status {};
    if (stat(path, &status) == 0) {
        return Presence::kThere;
    }
    return errno == ENOENT ? Presence::kMissing : Presence::kUnknown;
}

}  // namespace taviwireless::wireless

#endif

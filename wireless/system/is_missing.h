#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_IS_MISSING_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_IS_MISSING_H

#include <sys/stat.h>
#include <tavicore/file.h>

#include <cerrno>

namespace taviwireless::wireless {

// Whether the system says that there is no such file. One that merely cannot be looked at is not
// missing: settings in it may be what protects a network.
inline bool IsMissing(const char* path) {
    struct stat status {};
    return VEXACFileExist(path) == 0 && stat(path, &status) != 0 && errno == ENOENT;
}

}  // namespace taviwireless::wireless

#endif

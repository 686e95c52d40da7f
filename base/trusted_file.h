// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_TRUSTED_FILE_H
#define TAVIWIRELESS_BASE_TRUSTED_FILE_H

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/types.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <optional>
#include <string>

#include "base/unique_fd.h"

// Files in folders that others can write in, such as "/tmp/". Whoever is on the machine may put
// anything there under any name: only a regular file of root or of the own user counts.
namespace taviwireless {

constexpr off_t kTrustedFileLimit = 65536;  // bytes; far above what any of these files holds

// Whether what this user owns is trusted: root's, or one's own.
inline bool IsTrustedOwner(uid_t owner) {
    return owner == 0 || owner == geteuid();
}

// Opens path, from the folder on where it is relative, for reading. Never follows a link at its end
// and never waits for the other end of a pipe. Without a descriptor errno tells why: ENOENT when
// nothing is there, ELOOP for a link, EPERM for what is no regular file or somebody else's, EFBIG
// when it holds more than limit bytes.
inline UniqueFd OpenTrustedAt(int folder, const std::string& path,
                              off_t limit = kTrustedFileLimit) {
    UniqueFd file(
        openat(folder, path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
    struct stat status {};
    if (!file || fstat(file.Get(), &status) != 0) {
        return UniqueFd();
    }
    if (!S_ISREG(status.st_mode) || !IsTrustedOwner(status.st_uid)) {
        file.Close();
        errno = EPERM;
    } else if (status.st_size > limit) {
        file.Close();
        errno = EFBIG;
    }
    return file;
}

inline UniqueFd OpenTrusted(const std::string& path, off_t limit = kTrustedFileLimit) {
    return OpenTrustedAt(AT_FDCWD, path, limit);
}

// The whole text of path, which OpenTrusted must accept; nothing, with errno, when it does not or
// when reading fails. A file that grows meanwhile is cut at limit.
inline std::optional<std::string> ReadTrusted(const std::string& path,
                                              off_t limit = kTrustedFileLimit) {
    const UniqueFd file = OpenTrusted(path, limit);
    if (!file) {
        return std::nullopt;
    }
    std::string text;
    char buffer[4096];
    const auto most = static_cast<size_t>(limit);
    while (text.size() < most) {
        const ssize_t count = read(file.Get(), buffer, std::min(sizeof buffer, most - text.size()));
        if (count < 0 && errno != EINTR) {
            return std::nullopt;
        }
        if (count == 0) {
            break;
        }
        text.append(buffer, count > 0 ? static_cast<size_t>(count) : 0);
    }
    return text;
}

}  // namespace taviwireless

#endif

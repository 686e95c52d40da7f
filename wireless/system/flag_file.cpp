// SPDX-License-Identifier: MIT
#include "wireless/system/flag_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "base/trusted_file.h"
#include "wireless/system/files.h"

namespace taviwireless::wireless {

namespace {

constexpr mode_t kMode = 0644;

// Creates the file, never through a link. False when something is there already.
bool Create(const char* path) {
    const UniqueFd file(open(path, O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, kMode));
    return file || errno != EEXIST;
}

}  // namespace

FlagFile::~FlagFile() {
    unlink(path_);
}

bool FlagFile::IsRaised(const char* path) {
    struct stat status {};
    return lstat(path, &status) == 0 && S_ISREG(status.st_mode) && IsTrustedOwner(status.st_uid);
}

bool FlagFile::Raise() const {
    if (Create(path_)) {
        return true;
    }
    if (IsRaised(path_)) {
        return false;
    }
    RemoveAll(path_);
    return Create(path_) || !IsRaised(path_);
}

}  // namespace taviwireless::wireless

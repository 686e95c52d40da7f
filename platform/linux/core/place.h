// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_PLACE_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_PLACE_H

#include <sys/stat.h>
#include <sys/types.h>

#include <string>

#include "base/unique_fd.h"

// Where a path leads.
namespace tavicore {

using taviwireless::UniqueFd;

// An entry of a folder, whether or not something is there, that was no symbolic link when it was
// looked at.
struct Place {
    UniqueFd directory;  // names the folder, cannot be read itself (O_PATH)
    uid_t owner = 0;     // of the folder
    std::string name;
    // True when others can put entries into the folder, such as "/tmp": what is there counts only
    // when it is root's or one's own.
    bool isShared = false;
};

// Whether others can put entries into the folder of this status.
inline bool IsShared(const struct stat& folder) {
    return (folder.st_mode & (S_IWOTH | S_ISVTX)) != 0;
}

// Follows the links at the end of the path, in a shared folder only those of root or of one's own:
// as the kernel does where it protects links, which not every kernel is told to. Throws Failure,
// also when there is no such folder.
Place FindPlace(const std::string& path);

}  // namespace tavicore

#endif

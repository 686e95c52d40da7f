#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_NEW_FILE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_NEW_FILE_H

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>

#include "base/unique_fd.h"
#include "base/unique_file.h"

namespace taviwireless::wireless {

// Opens a file that is new: one that was there is removed, never written into, so that the mode
// holds from the first byte and nobody reads along who had the old one open. Null on failure.
inline UniqueFile CreateAnew(const char* path, mode_t mode) {
    unlink(path);
    UniqueFd handle(open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    UniqueFile file(handle ? fdopen(handle.Get(), "w") : nullptr);
    if (file) {
        handle.Release();
    }
    return file;
}

// Creates the file, empty, unless it is there already. An existing file keeps its mode.
inline bool MakeSureOf(const char* path, mode_t mode) {
    return static_cast<bool>(UniqueFd(open(path, O_WRONLY | O_CREAT | O_CLOEXEC, mode)));
}

// Removes what stands at path, with all that is in it when it is a folder; follows no link.
inline void RemoveAll(const char* path) {
    std::error_code ignored;
    std::filesystem::remove_all(path, ignored);
}

}  // namespace taviwireless::wireless

#endif

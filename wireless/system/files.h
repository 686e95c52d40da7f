// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_FILES_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_FILES_H

#include <fcntl.h>
#include <sys/stat.h>
#include <tavicore/file.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <string>

#include "base/unique_fd.h"
#include "base/unique_file.h"

namespace taviwireless::wireless {

// Opens a new file. A file that was there is removed and never written into, so that the mode holds
// from the first byte, and nobody who had the old file open can read the new text. Null on failure,
// with no file left.
inline UniqueFile CreateAnew(const char* path, mode_t mode) {
    unlink(path);
    UniqueFd handle(open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    UniqueFile file(handle ? fdopen(handle.Get(), "w") : nullptr);
    if (file) {
        handle.Release();
    } else if (handle) {
        unlink(path);
    }
    return file;
}

// Writes the text into the new file at path. Half of a configuration may be one without a key: what
// cannot be written whole is removed. False then.
inline bool WriteWhole(const UniqueFile& file, const char* path, const std::string& text) {
    const bool isWhole = fputs(text.c_str(), file.get()) >= 0 && fflush(file.get()) == 0;
    if (!isWhole) {
        unlink(path);
    }
    return isWhole;
}

// Whether the system says that there is no such file. One that merely cannot be looked at is not
// missing: settings in it may be what protects a network.
inline bool IsMissing(const char* path) {
    struct stat status {};
    return VEXACFileExist(path) == 0 && stat(path, &status) != 0 && errno == ENOENT;
}

// Removes what stands at path, with all that is in it when it is a folder; follows no link.
inline void RemoveAll(const char* path) {
    std::error_code ignored;
    std::filesystem::remove_all(path, ignored);
}

}  // namespace taviwireless::wireless

#endif

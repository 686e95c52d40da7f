#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_NEW_FILE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_NEW_FILE_H

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <filesystem>
#include <memory>

namespace taviwireless::wireless {

using File = std::unique_ptr<FILE, int (*)(FILE*)>;

// Opens a file that is new: one that was there is removed, never written into, so that the mode
// holds from the first byte and nobody reads along who had the old one open. Null on failure.
inline File CreateAnew(const char* path, mode_t mode) {
    unlink(path);
    const int handle = open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode);
    return File(handle >= 0 ? fdopen(handle, "w") : nullptr, fclose);
}

// Creates the file, empty, unless it is there already. An existing file keeps its mode.
inline bool MakeSureOf(const char* path, mode_t mode) {
    const int handle = open(path, O_WRONLY | O_CREAT | O_CLOEXEC, mode);
    return handle >= 0 && close(handle) == 0;
}

// Of root or of the own user.
inline bool IsTrusted(const struct stat& status) {
    return status.st_uid == 0 || status.st_uid == geteuid();
}

// Removes what stands at path, with all that is in it when it is a folder; follows no link.
inline void RemoveAll(const char* path) {
    std::error_code ignored;
    std::filesystem::remove_all(path, ignored);
}

}  // namespace taviwireless::wireless

#endif

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_UNIQUE_PIPE_H
#define TAVIWIRELESS_BASE_UNIQUE_PIPE_H

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

#include "base/unique_fd.h"

namespace taviwireless {

// Both ends of a pipe, which close themselves and are closed in programs that are started. Without
// them, errno tells why.
struct UniquePipe {
    UniqueFd readEnd;
    UniqueFd writeEnd;

    UniquePipe() {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) == 0) {
            readEnd = UniqueFd(ends[0]);
            writeEnd = UniqueFd(ends[1]);
        }
    }
    explicit operator bool() const { return static_cast<bool>(readEnd); }

    // Closes the writing end here, then waits, through signals, until there is something to read or
    // every other writing end is closed. Returns whether a byte came.
    bool ReadByte() {
        writeEnd.Close();
        char byte;
        ssize_t count;
        while ((count = read(readEnd.Get(), &byte, 1)) < 0 && errno == EINTR) {
        }
        return count == 1;
    }
};

}  // namespace taviwireless

#endif

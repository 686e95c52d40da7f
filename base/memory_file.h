// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_MEMORY_FILE_H
#define TAVIWIRELESS_BASE_MEMORY_FILE_H

#include <fcntl.h>
#include <linux/memfd.h>
#include <unistd.h>

#include <cstdlib>
#include <string>

#include "base/kernel_calls.h"
#include "base/unique_fd.h"

namespace taviwireless {

// Makes a file that is in no folder, so that nobody else can open it and it is gone with its last
// descriptor. It holds this text and is read from its beginning. Without a descriptor, errno tells
// why. Before Linux 3.17 it is a file of "/tmp/" that was removed at once.
inline UniqueFd MemoryFile(const std::string& text = "") {
    UniqueFd file(static_cast<int>(syscall(kMemfdCreate, "memory file", MFD_CLOEXEC)));
    if (!file) {
        char path[] = "/tmp/.memory-file-XXXXXX";
        file = UniqueFd(mkostemp(path, O_CLOEXEC));
        if (file) {
            unlink(path);
        }
    }
    const auto size = static_cast<ssize_t>(text.size());
    if (file && pwrite(file.Get(), text.data(), text.size(), 0) != size) {
        file.Close();
    }
    return file;
}

// Returns the whole text of the file. How far it was read before does not matter.
inline std::string TextOf(const UniqueFd& file) {
    std::string text;
    char part[4096];
    for (ssize_t count;
         (count = pread(file.Get(), part, sizeof part, static_cast<off_t>(text.size()))) > 0;) {
        text.append(part, static_cast<size_t>(count));
    }
    return text;
}

}  // namespace taviwireless

#endif

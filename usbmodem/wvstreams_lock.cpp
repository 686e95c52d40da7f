// SPDX-License-Identifier: MIT
// WvStreams' lock file of a serial port, "/var/lock/LCK.." and the port's name, in our own way: as
// everybody can write in that folder, only what root or the own user wrote there counts, and
// nothing there is ever waited for. It takes the place of WvStreams' own, which the linker then
// leaves in its archive.
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>
#include <wvlockdev.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <new>
#include <optional>
#include <string>

#include "base/sleep_out.h"
#include "base/trusted_file.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/text.h"

namespace {

using taviwireless::ReadTrusted;
using taviwireless::SleepOut;
using taviwireless::UniqueFd;
using taviwireless::usbmodem_lib::LockPath;

constexpr mode_t kLockMode = 0644;  // for other programs that use ports
// How often to try where somebody makes the file anew as often as it is removed.
constexpr int kAttempts = 3;

bool MakeLockFile(const char* path) {
    const UniqueFd file(open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, kLockMode));
    if (file && dprintf(file.Get(), "%10d\n", static_cast<int>(getpid())) < 0) {
        unlink(path);  // the disk is full; an empty lock file would count for ever
        return false;
    }
    return static_cast<bool>(file);
}

// The process that the text of a lock file names: 0 when it names none.
pid_t HolderIn(const std::optional<std::string>& text) {
    return text ? taviwireless::usbmodem_lib::ToInt(*text) : 0;
}

// Whether the lock file is there and counts. One that is empty may still be in the making; if it is
// so for long, who made it was killed. One that cannot be read is not ours to judge.
bool IsHeld(const char* path) {
    std::optional<std::string> text = ReadTrusted(path);
    if (text == "") {
        SleepOut(1);
        text = ReadTrusted(path);
    }
    if (!text) {
        const bool isMissingOrAStrangers = errno == ENOENT || errno == EPERM || errno == ELOOP;
        return !isMissingOrAStrangers;
    }
    const pid_t holder = HolderIn(text);
    return !text->empty() && (holder <= 0 || kill(holder, 0) == 0 || errno != ESRCH);
}

}  // namespace

WvLockDev::WvLockDev(WvString device) : devicename(device), lock_count(0) {
    const std::string path = device.cstr();
    filename = LockPath(path.substr(path.rfind('/') + 1)).c_str();
}

WvLockDev::~WvLockDev() {
    if (lock_count > 0) {
        lock_count = 1;
        try {
            unlock();
        } catch (const std::bad_alloc&) {  // the file stays, and holds for as long as this process
        }
    }
}

// Where a stranger keeps the name taken (by a folder, say), the port is used without a lock file:
// it is locked itself as well.
bool WvLockDev::lock() {
    for (int attempt = 0; lock_count == 0 && attempt < kAttempts; ++attempt) {
        if (MakeLockFile(filename)) {
            break;
        }
        if (errno != EEXIST || IsHeld(filename)) {
            return false;
        }
        unlink(filename);
    }
    ++lock_count;
    return true;
}

void WvLockDev::unlock() {
    if (lock_count > 0 && --lock_count == 0 && HolderIn(ReadTrusted(filename.cstr())) == getpid()) {
        unlink(filename);
    }
}

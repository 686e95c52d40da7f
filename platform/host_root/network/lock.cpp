// SPDX-License-Identifier: MIT
#include "platform/host_root/network/lock.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/time.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <string>

#include "platform/host_root/network/error.h"
#include "platform/host_root/network/paths.h"

namespace taviwireless::network {

namespace {

constexpr time_t kPatience = 60;  // s; a restart takes a few

bool LockInTime(int file) {
    struct sigaction action {};
    action.sa_handler = [](int) {};  // without SA_RESTART: it ends the wait
    sigaction(SIGALRM, &action, nullptr);
    // And again every second: this process may be held up before it waits.
    const itimerval patience{{1, 0}, {kPatience, 0}};
    setitimer(ITIMER_REAL, &patience, nullptr);
    const bool isLocked = flock(file, LOCK_EX) == 0;
    const int reason = errno;
    const itimerval never{};
    setitimer(ITIMER_REAL, &never, nullptr);
    errno = reason;
    return isLocked;
}

std::string Holder(int file) {
    char number[16] = "";
    const ssize_t length = pread(file, number, sizeof number - 1, 0);
    return length > 0 ? "process " + std::string(number, static_cast<size_t>(length))
                      : "another process";
}

void WriteHolder(int file) {
    const std::string number = std::to_string(getpid());
    if (ftruncate(file, 0) != 0 ||
        pwrite(file, number.data(), number.size(), 0) != static_cast<ssize_t>(number.size())) {
        throw Error(std::string("cannot write ") + kLockFile + ": " + strerror(errno));
    }
}

}  // namespace

UniqueFd TakeLock() {
    UniqueFd file(open(kLockFile, O_RDWR | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0600));
    struct stat status {};
    if (!file || fstat(file.Get(), &status) != 0) {
        throw Error(std::string("cannot open ") + kLockFile + ": " + strerror(errno));
    }
    if (!S_ISREG(status.st_mode) || status.st_uid != geteuid() || (status.st_mode & 077) != 0) {
        throw Error(std::string("others can open ") + kLockFile + "; remove it");
    }
    if (!LockInTime(file.Get())) {
        throw Error("the network is being restarted by " + Holder(file.Get()) +
                    ", which does not come to an end; try again");
    }
    WriteHolder(file.Get());
    return file;
}

}  // namespace taviwireless::network

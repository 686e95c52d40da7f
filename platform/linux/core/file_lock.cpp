// SPDX-License-Identifier: MIT
#include "file_lock.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <syslog.h>

#include <chrono>
#include <fstream>

#include "base/trusted_file.h"
#include "failure.h"

namespace tavicore {
namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds kLongestWait{2};
constexpr useconds_t kPause = 1000;  // µs
constexpr int kCarefully = O_RDWR | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC;

// Whether the lock file counts: root, this user and the owner of the folder may have the lock.
bool IsOurs(const struct stat& lock, const Place& place) {
    return S_ISREG(lock.st_mode) &&
           (taviwireless::IsTrustedOwner(lock.st_uid) || lock.st_uid == place.owner);
}

// flock() does not tell who has a lock, nor that somebody waits for it. These two marks in the lock
// file do: locks of fcntl(), on a byte each.
constexpr off_t kHolderMark = 0;
constexpr off_t kWaiterMark = 1;

struct flock Mark(off_t which, short type) {
    struct flock mark {};
    mark.l_type = type;
    mark.l_start = which;
    mark.l_len = 1;
    return mark;
}

void PutHolderMark(int file) {
    struct flock mark = Mark(kHolderMark, F_WRLCK);
    fcntl(file, F_SETLK, &mark);  // of the process: the kernel knows its number
}

// 0 when it is this process, or one that cannot be seen from here.
pid_t HolderOf(int file) {
    struct flock mark = Mark(kHolderMark, F_WRLCK);
    const bool isMarked = fcntl(file, F_GETLK, &mark) == 0 && mark.l_type != F_UNLCK;
    return isMarked && mark.l_pid > 0 ? mark.l_pid : 0;
}

void PutWaiterMark(int file) {
    struct flock mark = Mark(kWaiterMark, F_RDLCK);
    fcntl(file, F_OFD_SETLK, &mark);
}

// Always true where the kernel has no such marks (before Linux 3.15).
bool IsAwaited(int file) {
    struct flock mark = Mark(kWaiterMark, F_WRLCK);
    return fcntl(file, F_OFD_GETLK, &mark) != 0 || mark.l_type != F_UNLCK;
}

std::string ProgramOf(pid_t pid) {
    std::ifstream file("/proc/" + std::to_string(pid) + "/comm");
    std::string name;
    std::getline(file, name);
    return name;
}

}  // namespace

FileLock::FileLock(const Place& place, const char* path)
    : place_(place), name_("." + place.name + ".lock") {
    const auto deadline = Clock::now() + kLongestWait;
    while (!Try()) {
        if (Clock::now() >= deadline) {
            syslog(LOG_ERR, "%s:%d Cannot write %s: %s holds its lock", "file_lock.cpp", __LINE__,
                   path, Holder().c_str());
            throw Failure{VEXAC_ERR_LOCKED};
        }
        usleep(kPause);
    }
}

FileLock::~FileLock() {
    if (!isTaken_) {
        return;
    }
    const bool isAwaited = IsAwaited(file_.Get());
    unlinkat(place_.directory.Get(), name_.c_str(), 0);
    // Closing alone would not unlock while a child that another thread forked has the file.
    flock(file_.Get(), LOCK_UN);
    if (isAwaited) {
        usleep(2 * kPause);  // else a writer that comes again at once would always win
    }
}

// True when there is nothing more to wait for.
bool FileLock::Try() {
    if (!file_ && !Open()) {
        return true;
    }
    struct stat status {};
    if (!file_ || fstat(file_.Get(), &status) != 0 || !IsOurs(status, place_)) {
        file_.Close();
        RemoveStrangers();
        return false;
    }
    if (flock(file_.Get(), LOCK_EX | LOCK_NB) != 0) {
        if (errno != EWOULDBLOCK) {
            if (isNew_) {  // where files cannot be locked, nobody else has it
                unlinkat(place_.directory.Get(), name_.c_str(), 0);
            }
            throw Failure{VEXAC_ERR_IO};
        }
        PutWaiterMark(file_.Get());
        return false;
    }
    if (!IsStillThere()) {  // its holder has just removed it
        file_.Close();
        return false;
    }
    PutHolderMark(file_.Get());
    isTaken_ = true;
    return true;
}

// Opens or makes the lock file. False when the folder cannot be written. A lock file that is there
// but cannot be opened leaves file_ empty.
bool FileLock::Open() {
    const int folder = place_.directory.Get();
    file_ = UniqueFd(openat(folder, name_.c_str(), O_CREAT | O_EXCL | kCarefully, 0600));
    isNew_ = static_cast<bool>(file_);
    if (isNew_) {
        // So that the owner of the folder can take over what a killed root leaves; only root can.
        constexpr gid_t kSameGroup = static_cast<gid_t>(-1);
        [[maybe_unused]] const int result = fchown(file_.Get(), place_.owner, kSameGroup);
        return true;
    }
    const bool isThere = errno == EEXIST;
    if (isThere) {
        file_ = UniqueFd(openat(folder, name_.c_str(), kCarefully));
    }
    if (!file_ && (errno == EROFS || (!isThere && errno == EACCES))) {
        return false;
    }
    if (!isThere) {
        throw Failure{VEXAC_ERR_IO};
    }
    return true;
}

// Removes what a stranger put at the lock file's name, where the folder lets this user. Between the
// look and the removal another writer may have put its lock there: then one of two changes is lost,
// which is better than that nobody can write.
void FileLock::RemoveStrangers() const {
    struct stat status {};
    if (LookAtPath(&status) && !IsOurs(status, place_)) {
        unlinkat(place_.directory.Get(), name_.c_str(), 0);
    }
}

bool FileLock::LookAtPath(struct stat* status) const {
    return fstatat(place_.directory.Get(), name_.c_str(), status, AT_SYMLINK_NOFOLLOW) == 0;
}

bool FileLock::IsStillThere() const {
    struct stat locked {};
    struct stat there {};
    return fstat(file_.Get(), &locked) == 0 && LookAtPath(&there) &&
           locked.st_dev == there.st_dev && locked.st_ino == there.st_ino;
}

std::string FileLock::Holder() const {
    const pid_t pid = file_ ? HolderOf(file_.Get()) : 0;
    if (pid != 0) {
        return "process " + std::to_string(pid) + " (" + ProgramOf(pid) + ')';
    }
    struct stat status {};
    LookAtPath(&status);
    return "a process of user " + std::to_string(status.st_uid);
}

}  // namespace tavicore

// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_FILE_LOCK_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_FILE_LOCK_H

#include <sys/stat.h>

#include <string>

#include "place.h"

namespace tavicore {

// The right to replace the file at a place, which one writer has at a time.
//
// It is the lock of a file of its own beside the file, ".NAME.lock", which nobody but its owner and
// root can open, and so nobody else can lock. It lies beside the file and in no folder of locks,
// because there whoever can replace the file can also make it, at any time of the boot, and all
// names of the file meet. It stays empty and needs no room on a full disk. It is removed with the
// lock; one that a killed writer left is not locked and is taken over.
class FileLock {
  public:
    // Waits up to two seconds; then logs who has the lock, as a holder of this file by the name of
    // path, and throws VEXAC_ERR_LOCKED.
    FileLock(const Place& place, const char* path);
    ~FileLock();
    FileLock(const FileLock&) = delete;
    FileLock& operator=(const FileLock&) = delete;

    // False when the folder cannot be written, and so there is nothing to protect.
    bool IsTaken() const { return isTaken_; }

  private:
    bool Try();
    bool Open();
    void RemoveStrangers() const;
    bool LookAtPath(struct stat* status) const;
    bool IsStillThere() const;
    std::string Holder() const;

    const Place& place_;
    std::string name_;
    UniqueFd file_;
    bool isNew_ = false;  // the file was not there before
    bool isTaken_ = false;
};

}  // namespace tavicore

#endif

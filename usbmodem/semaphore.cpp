#include <sys/ipc.h>
#include <sys/sem.h>
#include <taviwireless/semaphore.h>

#include <cerrno>

#include "common/log.h"

namespace taviwireless::semaphore {

namespace {

constexpr int kPermissions = 0666;

// The caller of semctl defines this union (POSIX).
union SemaphoreArgument {
    int val;
    semid_ds* buf;
    unsigned short* array;
};

}  // namespace

Semaphore::Semaphore(unsigned int key) : key_(key) {}

int Semaphore::Get(int* semid) {
    if (semid == nullptr) {
        return -1;
    }
    const key_t key = static_cast<key_t>(key_);
    int id = semget(key, 1, IPC_CREAT | IPC_EXCL | kPermissions);
    if (id >= 0) {
        SemaphoreArgument initial{};
        initial.val = 1;
        if (semctl(id, 0, SETVAL, initial) < 0) {
            return -1;
        }
    } else if (errno == EEXIST) {
        id = semget(key, 1, kPermissions);  // unchecked: a failure shows in semop
    } else {
        return -1;
    }
    *semid = id;
    return 0;
}

int Semaphore::Enter() {
    return Change(-1);
}

int Semaphore::Release() {
    return Change(1);
}

int Semaphore::Change(short by) {
    int semid = -1;
    // The result is not looked at: with semid -1, semop fails and says why.
    Get(&semid);
    sembuf operation{0, by, SEM_UNDO};
    int result = semop(semid, &operation, 1);
    // A signal is no failure: callers release after a failed Enter as well, and a release without a
    // lock would let two holders in from then on.
    while (result < 0 && errno == EINTR) {
        result = semop(semid, &operation, 1);
    }
    if (result < 0) {
        TAVI_LOG_ERROR("semop fail semid %d errno %d", semid, errno);
        return -1;
    }
    return 0;
}

}  // namespace taviwireless::semaphore

// SPDX-License-Identifier: MIT
#include <sys/ipc.h>
#include <sys/sem.h>
#include <taviwireless/semaphore.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <ctime>

#include "common/log.h"

namespace taviwireless::semaphore {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kPermissions = 0666;
// Everybody may take the lock, and keep it. An honest holder has it for one exchange with a modem,
// which takes 4 s at most (1 s until it is quiet, 1 s until it answers, 2 s of answer).
constexpr std::chrono::seconds kLongestWait{5};

// The caller of semctl defines this union (POSIX).
union SemaphoreArgument {
    int val;
    semid_ds* buf;
    unsigned short* array;
};

// As semop, but fails with EAGAIN at the deadline. A caught signal does not end the wait: callers
// release after a failed Enter as well, and a release without a lock lets two holders in.
int ChangeUntil(Clock::time_point deadline, int semid, sembuf operation) {
    using std::chrono::nanoseconds;
    for (;;) {
        const auto left = std::max<nanoseconds>(deadline - Clock::now(), nanoseconds::zero());
        const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(left);
        const timespec limit{static_cast<time_t>(seconds.count()),
                             static_cast<long>((left - seconds).count())};
        if (semtimedop(semid, &operation, 1, &limit) == 0) {
            return 0;
        }
        if (errno != EINTR) {
            return -1;
        }
    }
}

bool SetFree(int semid) {
    SemaphoreArgument initial{};
    initial.val = 1;
    return semctl(semid, 0, SETVAL, initial) == 0;
}

// Whether nobody ever took the lock: who made it was killed before it had its value.
bool WasNeverUsed(int semid) {
    semid_ds description{};
    SemaphoreArgument status{};
    status.buf = &description;
    return semctl(semid, 0, IPC_STAT, status) == 0 && description.sem_otime == 0;
}

}  // namespace

Semaphore::Semaphore(unsigned int key) : key_(key) {}

int Semaphore::Get(int* semid) {
    if (semid == nullptr) {
        return -1;
    }
    const key_t key = static_cast<key_t>(key_);
    int id = semget(key, 1, IPC_CREAT | IPC_EXCL | kPermissions);
    if (id >= 0) {
        if (!SetFree(id)) {
            TAVI_LOG_ERROR("semctl fail semid %d errno %d", id, errno);
            return -1;
        }
    } else if (errno == EEXIST) {
        id = semget(key, 1, kPermissions);  // unchecked: a failure shows in semop
    } else {
        TAVI_LOG_ERROR("semget fail key %u errno %d", key_, errno);  // ENOSPC: no more sets
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
    const sembuf operation{0, by, SEM_UNDO};
    int result = ChangeUntil(Clock::now() + kLongestWait, semid, operation);
    if (result != 0 && errno == EAGAIN && WasNeverUsed(semid) && SetFree(semid)) {
        result = ChangeUntil(Clock::now(), semid, operation);
    }
    if (result != 0) {
        TAVI_LOG_ERROR("semop fail semid %d errno %d", semid, errno);
        return -1;
    }
    return 0;
}

}  // namespace taviwireless::semaphore
